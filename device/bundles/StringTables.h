#pragma once

#include "platform/values/Error.h"
#include "platform/values/Text.h"

#include <expected>
#include <filesystem>
#include <map>
#include <string>
#include <unordered_map>
#include <vector>

namespace nimbra::device {

/// The texts of one string table by their keys.
using StringTable = std::unordered_map<std::string, Text>;
/// The string tables of one language by their names.
using StringTables = std::unordered_map<std::string, StringTable>;

/// The string tables of a bundle in all of its languages, by BCP 47 tags.
class LanguageTables {
public:
    /// Reads every file LANGUAGE/TABLE.json in `folder`: flat objects of keys and texts. An error
    /// names the first file that is no table.
    [[nodiscard]] static std::expected<LanguageTables, Error>
    read(const std::filesystem::path& folder);

    /// One set of tables that gives for each key the text of the first of `languages` that has it.
    [[nodiscard]] StringTables merged(const std::vector<std::string>& languages) const;

private:
    std::map<std::string, StringTables> _languages;
};

} // namespace nimbra::device
