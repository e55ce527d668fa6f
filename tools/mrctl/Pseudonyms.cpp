#include "tools/mrctl/Pseudonyms.h"

#include "device/DeviceError.h"
#include "device/files/PercentEncoding.h"
#include "tools/mrctl/Characters.h"
#include "tools/mrctl/PathPatterns.h"
#include "tools/mrctl/SecretPatterns.h"

#include <algorithm>
#include <array>
#include <nlohmann/json.hpp>
#include <utility>

namespace nimbra::mrctl {

namespace {

/// How many bytes the search looks at first.
constexpr std::size_t startSize = 3;

std::uint32_t startOf(std::string_view text) {
    std::uint32_t start = 0;
    for (const char character : text.substr(0, startSize)) {
        start = start * 256U + static_cast<unsigned char>(character);
    }
    return start;
}

/// Whether a device may be called so without that everything is called so.
bool isOrdinaryWord(const std::string& value) {
    constexpr std::array words{"able",      "account",     "accounts",     "and",
                               "app",       "application", "are",          "array",
                               "cannot",    "cellular",    "cloud",        "com",
                               "container", "data",        "debug",        "default",
                               "device",    "devices",     "disk",         "document",
                               "documents", "drive",       "email",        "error",
                               "example",   "expected",    "fails",        "failed",
                               "false",     "file",        "files",        "for",
                               "found",     "from",        "has",          "home",
                               "http",      "https",       "identity",     "info",
                               "json",      "kind",        "last",         "lib",
                               "line",      "log",         "more",         "name",
                               "new",       "nimbra",      "nimbra drive", "nimbra-settings",
                               "not",       "nothing",     "notice",       "null",
                               "number",    "object",      "off",          "org",
                               "pad",       "path",        "phone",        "preferences",
                               "primary",   "program",     "progress",     "read",
                               "root",      "run",         "secret",       "service",
                               "set",       "settings",    "stands",       "standard",
                               "string",    "sync",        "system",       "text",
                               "the",       "there",       "true",         "user",
                               "usr",       "var",         "was",          "with",
                               "written",   "you"};
    const std::string lower = lowerCase(value);
    return std::ranges::find(words, lower) != words.end();
}

bool isOwnFieldOnly(const std::string& value) {
    constexpr std::size_t mostDigits = 5;
    const bool isShortNumber = value.size() <= mostDigits && std::ranges::all_of(value, isDigit);
    return value.size() < startSize || isShortNumber || isOrdinaryWord(value);
}

bool isWholeWordOnly(const std::string& value) {
    constexpr std::size_t mostBytes = 7;
    return value.size() <= mostBytes && std::ranges::none_of(value, isBeyondAscii);
}

/// Whether the word from `begin` to `end` does not go on in `text`. Where it begins or ends with a
/// sign, it does not go on there.
bool isWholeWord(std::string_view text, std::size_t begin, std::size_t end) {
    const bool goesOnBefore = begin > 0 && isWord(text[begin - 1]) && isWord(text[begin]);
    const bool goesOnBehind = end < text.size() && isWord(text[end]) && isWord(text[end - 1]);
    return !goesOnBefore && !goesOnBehind;
}

std::string inJson(const std::string& value, bool isAscii) {
    using Json = nlohmann::json;
    const std::string text = Json(value).dump(-1, ' ', isAscii, Json::error_handler_t::replace);
    return text.substr(1, text.size() - 2);
}

std::vector<std::string> spellingsOf(const std::string& value) {
    return {value,
            device::oneLine(value),
            inJson(value, false),
            inJson(value, true),
            device::percentEncoded(value),
            device::percentEncoded(value, "/.@:+~"),
            fileNamePart(value)};
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
    if (search == Search::ownFields || isOwnFieldOnly(value)) {
        return;
    }
    for (const std::string& spelling : spellingsOf(value)) {
        this->search(spelling, index);
    }
}

void Pseudonyms::learnFrom(std::string_view text) {
    for (const auto& [begin, size, kind] : findSecrets(text, _root)) {
        const std::string value(text.substr(begin, size));
        if (kind == SecretKind::path || kind == SecretKind::text) {
            // They are found again by what they look like.
            static_cast<void>(valueOf(kind, value));
        } else {
            learn(kind, value);
        }
        if (kind == SecretKind::email) {
            // Many are called like the first half of their address.
            learn(SecretKind::user, value.substr(0, std::min(value.find('@'), value.find("%40"))));
        }
        if (kind == SecretKind::path) {
            const PathNames names = namesInPath(value);
            learn(SecretKind::user, names.user);
            learn(SecretKind::file, names.document);
        }
    }
}

std::size_t Pseudonyms::valueOf(SecretKind kind, const std::string& text) {
    const auto [place, isNew] = _valueOfText.emplace(text, _values.size());
    if (isNew) {
        _values.push_back({.kind = kind, .pseudonym = {}, .places = 0});
    }
    return place->second;
}

void Pseudonyms::search(const std::string& spelling, std::size_t value) {
    if (isOwnFieldOnly(spelling) || _spellings.contains(spelling)) {
        return;
    }
    // Another spelling of a value may be a value of its own.
    const std::size_t owner = _valueOfText.emplace(spelling, value).first->second;
    _spellings.emplace(spelling,
                       Spelling{.value = owner, .asWholeWord = isWholeWordOnly(spelling)});
    _sizesOfStart[startOf(spelling)].insert(spelling.size());
}

void Pseudonyms::findSpellings(std::string_view text, std::vector<Match>& matches) const {
    for (std::size_t begin = 0; begin + startSize <= text.size(); ++begin) {
        const auto sizes = _sizesOfStart.find(startOf(text.substr(begin)));
        if (sizes == _sizesOfStart.end()) {
            continue;
        }
        for (const std::size_t size : sizes->second) {
            if (begin + size > text.size()) {
                break;
            }
            const auto found = _spellings.find(text.substr(begin, size));
            if (found != _spellings.end() &&
                (!found->second.asWholeWord || isWholeWord(text, begin, begin + size))) {
                matches.push_back({begin, begin + size, found->second.value});
            }
        }
    }
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
    std::vector<Match> matches;
    findSpellings(text, matches);
    for (const auto& [begin, size, kind] : findSecrets(text, _root)) {
        matches.push_back(
            {begin, begin + size, valueOf(kind, std::string(text.substr(begin, size)))});
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
