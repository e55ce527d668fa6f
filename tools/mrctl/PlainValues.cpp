#include "tools/mrctl/PlainValues.h"

#include "tools/mrctl/Characters.h"

#include <algorithm>
#include <array>
#include <string>

namespace nimbra::mrctl {

namespace {

bool isClosing(char character) {
    return isQuote(character) || std::string_view("\\)]}>").contains(character);
}

bool isOfName(char character) {
    return isAlphanumeric(character) || std::string_view("_-.").contains(character);
}

/// Behind the signs, and the tags where there may be some, that close a value which ends at `end`.
std::size_t endOfClosing(std::string_view text, std::size_t end, bool isTagged) {
    end = endOfRun(text, end, isClosing);
    while (isTagged && text.substr(end).starts_with("</")) {
        const std::size_t tag = endOfRun(text, end + 2, isOfName);
        if (!text.substr(tag).starts_with('>')) {
            break;
        }
        end = endOfRun(text, tag, isClosing);
    }
    return end;
}

/// Whether a name stands at `begin` with the sign of a value behind it. Behind a blank alone, many
/// a word has a colon.
bool isNamed(std::string_view text, std::size_t begin, bool isBehindBlank) {
    begin = endOfRun(text, begin, [](char character) {
        return isQuote(character) || std::string_view("\\{[(").contains(character);
    });
    const std::size_t end = endOfRun(text, begin, isOfName);
    if (end == begin) {
        return false;
    }
    const std::size_t sign = isBehindBlank ? end : endOfRun(text, end, [](char character) {
        return isBlank(character) || isQuote(character) || character == '\\';
    });
    const std::string_view rest = text.substr(sign);
    return rest.starts_with('=') || (!isBehindBlank && rest.starts_with(':'));
}

} // namespace

bool isPlainWord(std::string_view word) {
    constexpr std::array<std::string_view, 7> words{"null", "true", "false", "nil",
                                                    "none", "yes",  "no"};
    constexpr std::size_t longest = 5;
    return word.size() <= longest && std::ranges::find(words, lowerCase(word)) != words.end();
}

bool isEndOfValue(std::string_view text, std::size_t name, std::size_t begin, std::size_t end) {
    const std::string_view before = text.substr(name, begin - name);
    const std::size_t closed = endOfClosing(text, end, before.contains('>'));
    const std::size_t next = endOfRun(text, closed, [](char character) {
        return isBlank(character) || std::string_view(",;&").contains(character);
    });
    const std::string_view rest = text.substr(next);
    if (rest.empty() || rest == ".") {
        return true;
    }
    // A list that is still open may go on with the secret.
    const auto count = [](std::string_view signs, char sign) {
        return std::ranges::count(signs, sign);
    };
    const std::string_view behind = text.substr(end, closed - end);
    if (count(before, '[') > count(behind, ']') || count(before, '{') > count(behind, '}')) {
        return false;
    }
    if (rest.starts_with('<')) {
        return behind.contains("</");
    }
    const bool isParted =
        text.substr(closed, next - closed).find_first_of(",;&") != std::string_view::npos;
    return next > closed && isNamed(text, next, !isParted);
}

bool isPlainValue(std::string_view text, std::size_t name, std::size_t begin) {
    const std::size_t end = endOfRun(text, begin, isAlphanumeric);
    return isPlainWord(text.substr(begin, end - begin)) && isEndOfValue(text, name, begin, end);
}

std::size_t endOfIdentifier(std::string_view text, std::size_t begin) {
    constexpr std::array starts{"com.", "org.", "net.", "io.", "dev."};
    const std::string_view value = text.substr(begin);
    if (std::ranges::none_of(starts,
                             [value](const char* start) { return value.starts_with(start); })) {
        return begin;
    }
    std::size_t end = begin;
    std::size_t parts = 0;
    for (std::size_t part = begin; part < text.size(); part = end + 1) {
        const std::size_t behind = endOfRun(text, part, [](char character) {
            return isAlphanumeric(character) || character == '-' || character == '_';
        });
        // "io.Bob" is somebody.
        const bool isSmall = std::ranges::none_of(text.substr(part, behind - part), isUpper);
        if (behind == part || (parts < 2 && !isSmall)) {
            break;
        }
        ++parts;
        end = behind;
        if (end == text.size() || text[end] != '.') {
            break;
        }
    }
    const std::string_view rest = text.substr(end);
    const bool isApart = rest.empty() || isBlank(rest[0]) || isClosing(rest[0]) ||
                         std::string_view(",;&.").contains(rest[0]) || rest.starts_with("</");
    return parts > 2 && isApart ? end : begin;
}

bool isErrorNumber(std::string_view text, std::size_t begin) {
    constexpr std::size_t mostDigits = 3;
    const std::size_t end = endOfRun(text, begin, isDigit);
    // "482-913" is one number.
    const std::size_t next = endOfRun(text, end, [](char character) {
        return isBlank(character) || std::string_view("-./").contains(character);
    });
    const bool goesOn = next < text.size() && isDigit(text[next]);
    return end > begin && end - begin <= mostDigits && !goesOn &&
           (end == text.size() || !isAlphanumeric(text[end]));
}

} // namespace nimbra::mrctl
