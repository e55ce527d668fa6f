#pragma once

#include "tools/mrctl/SecretKind.h"
#include "tools/mrctl/SpellingIndex.h"

#include <cstddef>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace nimbra::mrctl {

/// The name of a device as it stands in the name of an archive.
[[nodiscard]] std::string fileNamePart(std::string name);

/// Puts pseudonyms ("device-3") in the place of what does not leave the device. The same value has
/// the same pseudonym, whatever it was met as; no pseudonym is a value itself.
///
/// First everything is learned, then everything is replaced. What was learned is searched for in
/// all texts: in its own spelling, and in every other that `FoldedText` makes the same. How,
/// depends on the value, so that one that is also a word does not spoil the texts:
/// - only in fields of its own: a value of one or two bytes, a number of up to five digits, a date,
///   a name of this system, and a word that the reports themselves are written in ("error");
/// - as a whole word: another value of ASCII characters and up to seven bytes;
/// - wherever it stands: every other one.
/// Where values overlap, all that they cover is replaced. Not thread-safe.
class Pseudonyms {
public:
    /// Where a value is searched for.
    enum class Search { everywhere, ownFields };

    /// `root` is where the device stands on this machine: an absolute path.
    explicit Pseudonyms(std::string root);

    /// From here on `value` is a secret, if it is not empty.
    void learn(SecretKind kind, const std::string& value, Search search = Search::everywhere);
    /// From here on each word of `value` that is long enough to be told from others is a secret.
    void learnWords(SecretKind kind, std::string_view value);
    /// `name` stays readable in all texts, unless its own field tells more.
    void keep(const std::string& name);
    /// From here on everything in `text` that looks like a secret is one.
    void learnFrom(std::string_view text);

    /// While it is set, `of` and `replaced` give back what they got and learn it: whatever is made
    /// with their help is made twice, first to learn all that it holds.
    void setLearning(bool isLearning) { _isLearning = isLearning; }

    /// What stands for `value` in a field that holds nothing else. Empty for an empty one.
    [[nodiscard]] std::string of(SecretKind kind, const std::string& value);
    /// Whether `value`, where it is all of a field, is one that was learned; a short number may be.
    [[nodiscard]] bool isKnown(const std::string& value) const;
    /// `text` with pseudonyms for every value that was learned and all that looks like a secret;
    /// one that is too long to be searched is left out as a whole.
    [[nodiscard]] std::string replaced(std::string_view text);

    /// How often something was replaced.
    struct Count {
        std::size_t values = 0;
        std::size_t places = 0;
    };
    [[nodiscard]] std::map<SecretKind, Count> counts() const;

private:
    struct Value {
        SecretKind kind;
        /// Empty until it is first used.
        std::string pseudonym;
        std::size_t places = 0;
    };
    struct Match {
        std::size_t begin;
        std::size_t end;
        std::size_t value;
    };

    std::size_t valueOf(SecretKind kind, const std::string& text);
    void search(const std::string& value, std::size_t index);
    [[nodiscard]] bool isOwnFieldOnly(const std::string& value) const;
    void findSpellings(std::string_view text, std::vector<Match>& matches) const;
    [[nodiscard]] const std::string& use(std::size_t value);
    [[nodiscard]] std::string freshPseudonym(SecretKind kind);

    std::string _root;
    bool _isLearning = false;
    std::vector<Value> _values;
    std::unordered_map<std::string, std::size_t> _valueOfText;
    /// What stays readable.
    std::set<std::string, std::less<>> _kept;
    SpellingIndex _spellings;
    SpellingIndex _foldedSpellings;
    std::map<SecretKind, std::size_t> _lastNumbers;
};

} // namespace nimbra::mrctl
