#include "device/apps/DesktopEntry.h"

#include "device/DeviceError.h"
#include "device/apps/EntitlementsReader.h"

#include <algorithm>
#include <array>
#include <set>
#include <unicode/unistr.h>
#include <unicode/ustring.h>
#include <utility>

namespace nimbra::device {

namespace {

constexpr std::size_t mostProblems = 10;

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view blanks = " \t\r";
    const auto first = text.find_first_not_of(blanks);
    if (first == std::string_view::npos) {
        return {};
    }
    return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

bool isUtf8(std::string_view text) {
    UErrorCode status = U_ZERO_ERROR;
    std::int32_t length = 0;
    u_strFromUTF8(nullptr, 0, &length, text.data(), static_cast<std::int32_t>(text.size()),
                  &status);
    return status != U_INVALID_CHAR_FOUND;
}

bool isBlank(const std::string& text) {
    return icu::UnicodeString::fromUTF8(text).trim().isEmpty() != 0;
}

std::string unescaped(std::string_view value) {
    constexpr std::string_view letters = "sntr\\";
    constexpr std::string_view characters = " \n\t\r\\";
    std::string text;
    for (std::size_t index = 0; index < value.size(); ++index) {
        const bool isEscape = value[index] == '\\' && index + 1 < value.size();
        const auto known = isEscape ? letters.find(value[index + 1]) : std::string_view::npos;
        if (known == std::string_view::npos) {
            text += value[index];
        } else {
            text += characters[known];
            ++index;
        }
    }
    return text;
}

/// The locale of a name's key, "de_DE" for "Name[de_DE.UTF-8]"; nothing for another key. The
/// encoding is always that of the file.
std::optional<std::string> localeOfName(std::string_view key) {
    constexpr std::string_view start = "Name[";
    if (!key.starts_with(start) || !key.ends_with(']')) {
        return std::nullopt;
    }
    std::string locale(key.substr(start.size(), key.size() - start.size() - 1));
    if (const auto encoding = locale.find('.'); encoding != std::string::npos) {
        locale.erase(encoding, std::min(locale.find('@', encoding), locale.size()) - encoding);
    }
    return locale;
}

class Reader {
public:
    explicit Reader(const std::vector<std::string>& localeNames)
        : _localeNames(localeNames), _nameRank(localeNames.size() + 1) {}

    void readLine(std::string_view line) {
        ++_line;
        line = trimmed(line);
        if (line.empty() || line.starts_with('#')) {
            return;
        }
        if (line.starts_with('[') && line.ends_with(']')) {
            startGroup(line);
        } else if (_isInEntry) {
            readPair(line);
        }
    }

    [[nodiscard]] DesktopEntry takeEntry() {
        auto& problems = _entry.problems;
        if (_omittedProblems != 0) {
            problems.push_back({.line = _firstOmittedLine,
                                .what = "and " + std::to_string(_omittedProblems) +
                                        " more problems from here on"});
        }
        if (_entryLine == 0) {
            problems.push_back({.line = 1, .what = "no group [Desktop Entry]"});
        } else {
            _entry.isApplication = _isApplication;
        }
        // Nobody sees the name of an application that was removed.
        if (_entry.isApplication && !_entry.isHidden && !_entry.name) {
            const std::size_t line = _blankNameLine != 0 ? _blankNameLine : _entryLine;
            problems.insert(
                std::ranges::upper_bound(problems, line, {}, &DesktopEntry::Problem::line),
                {.line = line, .what = "no usable Name"});
        }
        return std::move(_entry);
    }

private:
    void report(std::string_view what) {
        if (_entry.problems.size() < mostProblems) {
            _entry.problems.push_back({.line = _line, .what = oneLine(what)});
            return;
        }
        _firstOmittedLine = _omittedProblems == 0 ? _line : _firstOmittedLine;
        ++_omittedProblems;
    }

    void startGroup(std::string_view line) {
        const bool isEntry = line == "[Desktop Entry]";
        _isInEntry = isEntry && _entryLine == 0;
        if (_isInEntry) {
            _entryLine = _line;
        } else if (isEntry) {
            report("[Desktop Entry] stands here again; the first one counts");
        }
    }

    void readPair(std::string_view line) {
        if (line.contains('\0')) {
            report("a byte that is zero");
            return;
        }
        if (!isUtf8(line)) {
            report("not UTF-8");
            return;
        }
        const auto equals = line.find('=');
        const std::string_view key = trimmed(line.substr(0, equals));
        if (equals == std::string_view::npos || key.empty()) {
            report("not a key and its value");
            return;
        }
        const std::string_view value = trimmed(line.substr(equals + 1));
        if (isWanted(key)) {
            readValue(key, value);
        }
    }

    /// Whether the key is one that says something here, for the first time.
    bool isWanted(std::string_view key) {
        static constexpr std::array<std::string_view, 5> keys{"Type", "Name", "Icon", "Hidden",
                                                              "X-Nimbra-Entitlements"};
        if (std::ranges::find(keys, key) == keys.end() && !rankOfName(key)) {
            return false;
        }
        if (!_keys.emplace(key).second) {
            report(std::string(key) + " stands here again; the first one counts");
            return false;
        }
        return true;
    }

    void readValue(std::string_view key, std::string_view value) {
        if (key == "Type") {
            _isApplication = value == "Application";
        } else if (key == "Icon") {
            _entry.icon = unescaped(value);
        } else if (key == "Hidden") {
            _entry.isHidden = value == "true";
            if (value != "true" && value != "false") {
                report("Hidden is neither true nor false");
            }
        } else if (key == "X-Nimbra-Entitlements") {
            readEntitlementsOf(unescaped(value));
        } else {
            readName(*rankOfName(key), unescaped(value));
        }
    }

    void readEntitlementsOf(const std::string& json) {
        if (auto entitlements = readEntitlements(json)) {
            _entry.entitlements = std::move(*entitlements);
        } else {
            report(entitlements.error().description);
        }
    }

    void readName(std::size_t rank, std::string name) {
        if (isBlank(name)) {
            _blankNameLine = _blankNameLine == 0 ? _line : _blankNameLine;
        } else if (rank < _nameRank) {
            _nameRank = rank;
            _entry.name = std::move(name);
        }
    }

    /// How good a name under `key` is for the user, 0 the best; nothing where it is no name or one
    /// in another language.
    [[nodiscard]] std::optional<std::size_t> rankOfName(std::string_view key) const {
        if (key == "Name") {
            return _localeNames.size();
        }
        const auto locale = localeOfName(key);
        const auto found = locale ? std::ranges::find(_localeNames, *locale) : _localeNames.end();
        if (found == _localeNames.end()) {
            return std::nullopt;
        }
        return static_cast<std::size_t>(found - _localeNames.begin());
    }

    const std::vector<std::string>& _localeNames;
    DesktopEntry _entry;
    std::size_t _line = 0;
    bool _isInEntry = false;
    /// Where the group starts; 0 before.
    std::size_t _entryLine = 0;
    bool _isApplication = true;
    std::set<std::string, std::less<>> _keys;
    /// The rank of the name that was kept.
    std::size_t _nameRank;
    /// The first blank name; 0 for none.
    std::size_t _blankNameLine = 0;
    std::size_t _omittedProblems = 0;
    std::size_t _firstOmittedLine = 0;
};

} // namespace

DesktopEntry DesktopEntry::read(std::string_view text,
                                const std::vector<std::string>& localeNames) {
    constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";
    if (text.starts_with(byteOrderMark)) {
        text.remove_prefix(byteOrderMark.size());
    }
    Reader reader(localeNames);
    while (!text.empty()) {
        const auto end = std::min(text.find('\n'), text.size());
        reader.readLine(text.substr(0, end));
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return reader.takeEntry();
}

} // namespace nimbra::device
