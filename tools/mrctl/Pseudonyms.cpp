#include "tools/mrctl/Pseudonyms.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/DecodedText.h"
#include "tools/mrctl/FoldedText.h"
#include "tools/mrctl/PathPatterns.h"
#include "tools/mrctl/SecretNames.h"
#include "tools/mrctl/SecretPatterns.h"

#include <algorithm>
#include <array>
#include <utility>

namespace nimbra::mrctl {

namespace {

/// Shorter ones are searched for nowhere.
constexpr std::size_t leastSearched = 3;
/// Longer ones stand in no second text.
constexpr std::size_t mostSearched = 512;

/// Whether a device may be called so without that everything is called so.
bool isOrdinaryWord(const std::string& value) {
    constexpr std::array words{
        "able",          "account",   "accounts",   "and",      "app",          "application",
        "applications",  "are",       "array",      "cannot",   "cellular",     "cloud",
        "com",           "container", "containers", "data",     "database",     "databases",
        "debug",         "default",   "device",     "devices",  "disk",         "document",
        "documentation", "documents", "drive",      "email",    "error",        "example",
        "expected",      "expired",   "failed",     "fails",    "false",        "file",
        "files",         "for",       "found",      "from",     "has",          "home",
        "http",          "https",     "identity",   "info",     "invalid",      "json",
        "kind",          "last",      "lib",        "line",     "log",          "missing",
        "more",          "name",      "new",        "nimbra",   "nimbra drive", "nimbra-settings",
        "not",           "nothing",   "notice",     "null",     "number",       "object",
        "off",           "org",       "pad",        "path",     "phone",        "preferences",
        "primary",       "private",   "program",    "progress", "public",       "read",
        "required",      "root",      "run",        "secret",   "service",      "set",
        "settings",      "shared",    "standard",   "stands",   "stratafile",   "string",
        "sync",          "system",    "tablet",     "text",     "the",          "there",
        "true",          "user",      "usr",        "var",      "was",          "with",
        "written",       "you"};
    const std::string lower = lowerCase(value);
    return std::ranges::find(words, lower) != words.end();
}

bool isShortNumber(const std::string& value) {
    constexpr std::size_t mostDigits = 5;
    return value.size() <= mostDigits && std::ranges::all_of(value, isDigit);
}

/// Whether `value` begins like a date or consists of the signs of a time.
bool isTime(std::string_view value) {
    constexpr std::string_view form = "0000-00-00";
    const bool isDate =
        value.size() >= form.size() &&
        std::ranges::equal(value.substr(0, form.size()), form, [](char character, char expected) {
            return expected == '0' ? isDigit(character) : character == expected;
        });
    constexpr std::size_t longestTime = 8;
    return isDate || (value.size() <= longestTime && value.contains(':') &&
                      std::ranges::all_of(value, [](char character) {
                          return isDigit(character) || character == ':';
                      }));
}

/// Whether `value` is a name that this system gives to data classes and services.
bool isSystemName(std::string_view value) {
    return std::ranges::any_of(std::array{"kAccountDataclass", "kPRVService"},
                               [value](const char* start) { return value.starts_with(start); }) &&
           std::ranges::all_of(value, isLetter);
}

bool isWholeWordOnly(const std::string& value) {
    constexpr std::size_t mostBytes = 7;
    return value.size() <= mostBytes && std::ranges::none_of(value, isBeyondAscii);
}

} // namespace

std::string fileNamePart(std::string name) {
    constexpr std::array<std::pair<std::string_view, std::string_view>, 5> steps{
        {{"/", ":"}, {"\"", "'"}, {"`", "'"}, {"\u2019", "'"}, {" ", "_"}}};
    for (const auto& [from, to] : steps) {
        for (std::size_t at = name.find(from); at != std::string::npos;
             at = name.find(from, at + to.size())) {
            name.replace(at, from.size(), to);
        }
    }
    return name;
}

Pseudonyms::Pseudonyms(std::string root) : _root(std::move(root)) {
    if (_root.size() > 1) {
        learn(SecretKind::path, _root);
    }
}

void Pseudonyms::learn(SecretKind kind, const std::string& value, Search search) {
    if (value.empty()) {
        return;
    }
    const std::size_t index = valueOf(kind, value);
    if (search == Search::everywhere && !isOwnFieldOnly(value)) {
        this->search(value, index);
    }
}

void Pseudonyms::learnWords(SecretKind kind, std::string_view value) {
    constexpr std::size_t leastWord = 5;
    const auto isPart = [](char character) {
        return isAlphanumeric(character) || isBeyondAscii(character);
    };
    for (std::size_t begin = 0; begin < value.size();) {
        const std::size_t end = endOfRun(value, begin, isPart);
        const std::string word(value.substr(begin, end - begin));
        // An application may be called by the same word.
        const bool isKept = std::ranges::any_of(_kept, [&word](const std::string& name) {
            return lowerCase(name).contains(lowerCase(word));
        });
        if (word.size() >= leastWord && !isKept && !std::ranges::all_of(word, isDigit)) {
            learn(kind, word);
        }
        begin = end + 1;
    }
}

void Pseudonyms::keep(const std::string& name) {
    _kept.insert(name);
}

void Pseudonyms::learnFrom(std::string_view text) {
    if (text.size() > kLongestText) {
        return;
    }
    for (const auto& [begin, size, kind, searched] : findSecrets(text, _root)) {
        const std::string value(text.substr(begin, size));
        if (kind == SecretKind::path || kind == SecretKind::text || searched < size) {
            // They are found again by what they look like.
            static_cast<void>(valueOf(kind, value));
        }
        if (kind != SecretKind::path && kind != SecretKind::text) {
            learn(kind, value.substr(0, searched));
        }
        if (kind == SecretKind::email) {
            // Many are called like the first half of their address.
            const std::string address = DecodedText(value).text;
            learn(SecretKind::user, address.substr(0, address.find('@')));
        }
        if (kind == SecretKind::path) {
            const PathNames names = namesInPath(DecodedText(value).text);
            learn(SecretKind::user, names.user);
            learn(SecretKind::file, names.document);
        }
    }
}

bool Pseudonyms::isOwnFieldOnly(const std::string& value) const {
    return value.size() < leastSearched || value.size() > mostSearched || isShortNumber(value) ||
           isTime(value) || isSystemName(value) || isOrdinaryWord(value) || _kept.contains(value) ||
           // "password" is no password.
           (std::ranges::all_of(value, isLetter) && kindOfValueNamed(value));
}

bool Pseudonyms::isKnown(const std::string& value) const {
    constexpr std::size_t leastKnown = 4;
    return value.size() >= leastKnown && _valueOfText.contains(value) &&
           (!isOwnFieldOnly(value) || isShortNumber(value));
}

std::size_t Pseudonyms::valueOf(SecretKind kind, const std::string& text) {
    const auto [place, isNew] = _valueOfText.emplace(text, _values.size());
    if (!isNew) {
        return place->second;
    }
    const std::size_t index = place->second;
    // An address is the same in capitals.
    const std::string lower = kind == SecretKind::email ? lowerCase(text) : text;
    if (const auto [other, isFirst] = _valueOfText.emplace(lower, index);
        !isFirst && lower != text) {
        return _valueOfText[text] = other->second;
    }
    _values.push_back({.kind = kind, .pseudonym = {}, .places = 0});
    return index;
}

void Pseudonyms::search(const std::string& value, std::size_t index) {
    _spellings.add(value, {.value = index, .asWholeWord = isWholeWordOnly(value)});
    const FoldedText folded(value);
    // Of a name of signs alone nothing is left to be searched for.
    if (folded.text.size() >= leastSearched && !isShortNumber(folded.text) &&
        !isOrdinaryWord(folded.text)) {
        _foldedSpellings.add(folded.text,
                             {.value = index,
                              .asWholeWord = isWholeWordOnly(folded.text),
                              .gaps = folded.gaps[folded.text.size() - 1] - folded.gaps.front()});
    }
}

void Pseudonyms::findSpellings(std::string_view text, std::vector<Match>& matches) const {
    const auto goesOn = [](std::string_view word, std::size_t index) {
        return index > 0 && index < word.size() && isAlphanumeric(word[index - 1]) &&
               isAlphanumeric(word[index]);
    };
    _spellings.find(text, [&](std::size_t begin, std::size_t end, const Spelling& found) {
        if (!found.asWholeWord || (!goesOn(text, begin) && !goesOn(text, end))) {
            matches.push_back({begin, end, found.value});
        }
    });
    const FoldedText folded(text);
    const auto& gaps = folded.gaps;
    _foldedSpellings.find(
        folded.text, [&](std::size_t begin, std::size_t end, const Spelling& found) {
            const bool isWhole = (!goesOn(folded.text, begin) || gaps[begin] != gaps[begin - 1]) &&
                                 (!goesOn(folded.text, end) || gaps[end] != gaps[end - 1]);
            // A short one is not put together from several words.
            if (!found.asWholeWord || (isWhole && gaps[end - 1] - gaps[begin] <= found.gaps)) {
                matches.push_back({folded.begins[begin], folded.ends[end - 1], found.value});
            }
        });
}

std::string Pseudonyms::of(SecretKind kind, const std::string& value) {
    if (_isLearning && !_valueOfText.contains(value)) {
        learn(kind, value);
    }
    return _isLearning || value.empty() ? value : use(valueOf(kind, value));
}

std::string Pseudonyms::replaced(std::string_view text) {
    if (_isLearning) {
        learnFrom(text);
        return std::string(text);
    }
    if (isSystemName(text)) {
        return std::string(text);
    }
    if (text.size() > kLongestText) {
        return "(a line of " + std::to_string(text.size()) + " bytes is left out)";
    }
    std::vector<Match> matches;
    findSpellings(text, matches);
    for (const auto& [begin, size, kind, searched] : findSecrets(text, _root)) {
        if (!_kept.contains(text.substr(begin, size))) {
            matches.push_back(
                {begin, begin + size, valueOf(kind, std::string(text.substr(begin, size)))});
        }
    }
    // The longest first where several begin, so that it gives its name to what they cover.
    std::ranges::stable_sort(matches, [](const Match& left, const Match& right) {
        return std::pair(left.begin, right.end) < std::pair(right.begin, left.end);
    });
    std::string result;
    std::size_t done = 0;
    for (std::size_t index = 0; index < matches.size();) {
        Match covered = matches[index];
        std::size_t longest = covered.end - covered.begin;
        for (++index; index < matches.size() && matches[index].begin < covered.end; ++index) {
            const Match& match = matches[index];
            if (match.end - match.begin > longest) {
                longest = match.end - match.begin;
                covered.value = match.value;
            }
            covered.end = std::max(covered.end, match.end);
        }
        result += text.substr(done, covered.begin - done);
        result += use(covered.value);
        done = covered.end;
    }
    return result += text.substr(done);
}

const std::string& Pseudonyms::use(std::size_t value) {
    Value& used = _values[value];
    if (used.pseudonym.empty()) {
        used.pseudonym = freshPseudonym(used.kind);
    }
    ++used.places;
    return used.pseudonym;
}

std::string Pseudonyms::freshPseudonym(SecretKind kind) {
    while (true) {
        std::string pseudonym(nameOf(kind));
        pseudonym += '-' + std::to_string(++_lastNumbers[kind]);
        std::vector<Match> values;
        findSpellings(pseudonym, values);
        // What stands in every pseudonym of the kind cannot be kept out of it.
        const bool holdsValue = std::ranges::any_of(
            values, [kind](const Match& match) { return match.end > nameOf(kind).size() + 1; });
        if (!holdsValue && !_valueOfText.contains(pseudonym)) {
            return pseudonym;
        }
    }
}

std::map<SecretKind, Pseudonyms::Count> Pseudonyms::counts() const {
    std::map<SecretKind, Count> counts;
    for (const Value& value : _values) {
        if (value.places > 0) {
            ++counts[value.kind].values;
            counts[value.kind].places += value.places;
        }
    }
    return counts;
}

} // namespace nimbra::mrctl
