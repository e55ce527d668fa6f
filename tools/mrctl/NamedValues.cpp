#include "tools/mrctl/NamedValues.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/PlainValues.h"
#include "tools/mrctl/SecretNames.h"

#include <algorithm>
#include <optional>
#include <string>

namespace nimbra::mrctl {

namespace {

using Found = std::vector<FoundSecret>;

constexpr auto nowhere = std::string_view::npos;

bool isNameCharacter(char character) {
    return isAlphanumeric(character) || character == '_' || character == '-' || character == '.';
}

/// What may stand between a name and its value, and opens the value.
bool isBeforeValue(char character) {
    return isBlank(character) || isQuote(character) ||
           std::string_view("\\=:>|-{[(,").contains(character);
}

/// What closes a name, or stands between it and its sign.
bool isBehindName(char character) {
    return isBlank(character) || isQuote(character) ||
           std::string_view("\\]})").contains(character);
}

/// The value up to its end, as far as that can be told: what is searched for elsewhere.
std::size_t sizeOfFirstWord(std::string_view text, std::size_t begin) {
    const char before = begin > 0 ? text[begin - 1] : ' ';
    const std::size_t end = isQuote(before) ? text.find(before, begin) : nowhere;
    if (end != nowhere) {
        return end - begin;
    }
    return endOfRun(text, begin,
                    [](char character) {
                        return !isBlank(character) && !isQuote(character) &&
                               !std::string_view(",;&<>)]}\\").contains(character);
                    }) -
           begin;
}

void addRest(std::string_view text, std::size_t begin, SecretKind kind, bool isSigned,
             Found& found) {
    if (begin >= text.size()) {
        return;
    }
    const std::size_t size = sizeOfFirstWord(text, begin);
    const std::string_view word = text.substr(begin, size);
    // What only a blank parts from a name may be any word, and "none" stands everywhere.
    const bool isSearched = (isSigned && !isPlainWord(word)) || std::ranges::any_of(word, isDigit);
    found.push_back({.begin = begin,
                     .size = text.size() - begin,
                     .kind = kind,
                     .searched = isSearched ? size : 0});
}

/// Where the value begins whose name ends at `end`; nothing where none follows.
std::optional<std::size_t> valueBehind(std::string_view text, std::size_t begin, std::size_t end) {
    const bool isOption = begin == 0 ? text.starts_with("--") : text.substr(begin - 1, 1) == "-";
    const bool isTag = begin > 0 && text[begin - 1] == '<';
    const bool isPointer = begin > 0 && text[begin - 1] == '/';
    const std::size_t sign = endOfRun(text, end, isBehindName);
    if (sign >= text.size()) {
        return std::nullopt;
    }
    const std::string_view rest = text.substr(sign);
    const bool isScheme = rest.starts_with("://");
    const bool isHost = begin > 0 && text[begin - 1] == '@';
    // A message about a place in a file has its name before the colon.
    const bool isMessage = isPointer && rest.starts_with(": expected ");
    const bool isSigned = rest.starts_with('=') || rest.starts_with(':') ||
                          rest.starts_with("->") || (isTag && rest.starts_with('>'));
    const bool isBehindOption = (isOption || text.substr(begin, 2) == "--") && sign > end;
    if (isScheme || isMessage || isHost || !(isSigned || isBehindOption)) {
        return std::nullopt;
    }
    return endOfRun(text, sign, isBeforeValue);
}

/// Where the value at `begin` begins to tell something, whose name is all of `name`, a part of
/// `text`; the text's end where it does not.
std::size_t startOfSecret(std::string_view text, std::string_view name, SecretKind kind,
                          std::size_t begin) {
    const auto behindName = static_cast<std::size_t>(name.data() - text.data()) + name.size();
    const bool isHarmless = isPlainValue(text, behindName, begin) ||
                            (lastWordOf(name) == "code" && isErrorNumber(text, begin));
    if (isHarmless) {
        return text.size();
    }
    const std::size_t behind = kind == SecretKind::user ? endOfIdentifier(text, begin) : begin;
    if (behind == begin) {
        return begin;
    }
    return isEndOfValue(text, behindName, begin, behind)
               ? text.size()
               : endOfRun(text, behind, [](char character) {
                     return !isAlphanumeric(character) && !isBeyondAscii(character);
                 });
}

/// The end of the code that begins at `begin`, in one piece or with blanks between groups of as
/// many digits each.
std::size_t endOfCode(std::string_view text, std::size_t begin) {
    const auto isPart = [](char character) { return isDigit(character) || character == '-'; };
    std::size_t end = endOfRun(text, begin, isPart);
    const std::size_t size = end - begin;
    while (end < text.size() && text[end] == ' ') {
        const std::size_t next = endOfRun(text, end + 1, isPart);
        const bool goesOn = next < text.size() && isAlphanumeric(text[next]);
        if (next - end - 1 != size || size < 2 || goesOn) {
            break;
        }
        end = next;
    }
    return end;
}

/// The digits of a code that a sentence names: "your code is 482913".
void findCodes(std::string_view text, std::size_t end, Found& found) {
    constexpr std::size_t leastDigits = 4;
    std::size_t begin = endOfRun(text, end, isBlank);
    if (text.substr(begin).starts_with("is ")) {
        begin = endOfRun(text, begin + 2, isBlank);
    }
    const std::size_t behind = endOfCode(text, begin);
    if (begin > end && behind - begin >= leastDigits) {
        found.push_back({.begin = begin, .size = behind - begin, .kind = SecretKind::secret});
    }
}

/// Where the first value is whose name is known; nothing found where none is.
void findSigned(std::string_view text, Found& found) {
    for (std::size_t begin = 0; begin < text.size(); ++begin) {
        if (!isNameCharacter(text[begin])) {
            continue;
        }
        const std::size_t end = endOfRun(text, begin, isNameCharacter);
        const std::string_view name = text.substr(begin, end - begin);
        if (const auto kind = kindOfValueNamed(name)) {
            const auto value = valueBehind(text, begin, end);
            const std::size_t secret = value ? startOfSecret(text, name, *kind, *value) : nowhere;
            if (secret < text.size()) {
                // What follows an identifier may be any word.
                addRest(text, secret, *kind, secret == *value, found);
                return;
            }
            if (*kind == SecretKind::secret) {
                findCodes(text, end, found);
            }
        }
        begin = end;
    }
}

void findPasswords(std::string_view text, Found& found) {
    const std::string lower = lowerCase(text);
    for (const std::string_view word : kPasswordWords) {
        for (std::size_t at = lower.find(word); at != nowhere; at = lower.find(word, at + 1)) {
            // The rest of the name, "password2" and "passwordHash".
            const std::size_t end = endOfRun(text, at + word.size(), [word](char character) {
                return !isBeyondAscii(word.back()) &&
                       (isAlphanumeric(character) || character == '_');
            });
            std::size_t value = endOfRun(text, end, isBehindName);
            const bool isSigned =
                value < text.size() && std::string_view("=:>-").contains(text[value]);
            value = endOfRun(text, value, isBeforeValue);
            if (!isSigned && lower.compare(value, 3, "is ") == 0) {
                value = endOfRun(text, value + 2, isBeforeValue);
            }
            value = endOfRun(text, value, [](char character) {
                return !isAlphanumeric(character) && !isBeyondAscii(character);
            });
            if (value < text.size() && !isPlainValue(text, end, value)) {
                addRest(text, value, SecretKind::secret, isSigned, found);
                break;
            }
        }
    }
}

/// What stands behind the name of a way to log in.
void findSchemes(std::string_view text, Found& found) {
    const std::string lower = lowerCase(text);
    constexpr std::size_t leastToken = 4;
    // Keys in text form.
    constexpr std::string_view key = "-----BEGIN ";
    if (const std::size_t at = text.find(key); at != nowhere) {
        addRest(text, at + key.size(), SecretKind::secret, false, found);
    }
    for (const std::string_view scheme : {"bearer", "basic", "negotiate", "ntlm", "digest"}) {
        for (std::size_t at = lower.find(scheme); at != nowhere; at = lower.find(scheme, at + 1)) {
            const std::size_t end = at + scheme.size();
            const std::size_t begin = endOfRun(text, end, isBlank);
            if ((at > 0 && isAlphanumeric(text[at - 1])) || begin == end) {
                continue;
            }
            const std::size_t behind =
                endOfRun(text, begin, [](char character) { return !isBlank(character); });
            const std::string_view token = text.substr(begin, behind - begin);
            // "Basic settings" is none.
            const bool isWordOfText =
                scheme != "bearer" && std::ranges::all_of(token, [](char character) {
                    return isLower(character) || std::string_view(".,:;").contains(character);
                });
            if (token.size() >= leastToken && !isWordOfText) {
                addRest(text, begin, SecretKind::secret, true, found);
                break;
            }
        }
    }
}

} // namespace

void findNamedValues(std::string_view text, Found& found) {
    findSigned(text, found);
    findPasswords(text, found);
    findSchemes(text, found);
}

} // namespace nimbra::mrctl
