#pragma once

#include <map>
#include <ostream>
#include <set>
#include <string>

namespace nimbra::test {

/// What a text of a string table asks of its arguments.
struct TablePattern {
    /// The placeholders: the argument's number and its type ("none", "plural", "select", ...).
    std::set<std::pair<int, std::string>> placeholders;
    /// For each plural argument the categories that have a text.
    std::map<int, std::set<std::string>> pluralCategories;
    /// Why the text is no pattern; empty where it is one.
    std::string error;
};

/// Takes the pattern `text` apart.
[[nodiscard]] TablePattern readTablePattern(const std::string& text);

/// The plural categories of whole numbers in `language`.
[[nodiscard]] std::set<std::string> pluralCategoriesOf(const std::string& language);

} // namespace nimbra::test
