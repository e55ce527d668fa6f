#include "tools/mrctl/SecretPatterns.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/PathPatterns.h"

#include <algorithm>
#include <array>
#include <functional>
#include <string>

namespace nimbra::mrctl {

namespace {

using Found = std::vector<FoundSecret>;

bool isLocalPart(char character) {
    return isWord(character) || isBeyondAscii(character) ||
           std::string_view(".!#$%&*+-=?^_{|}~").contains(character);
}

bool isHost(char character) {
    return isWord(character) || isBeyondAscii(character) || character == '.' || character == '-';
}

/// The end of the part of `text` from `begin` on that consists of `isPart`.
template <class IsPart>
std::size_t endOfRun(std::string_view text, std::size_t begin, IsPart isPart) {
    while (begin < text.size() && isPart(text[begin])) {
        ++begin;
    }
    return begin;
}

void findAddresses(std::string_view text, Found& found) {
    const auto check = [&](std::size_t at, std::size_t mark) {
        std::size_t begin = at;
        while (begin > 0 && isLocalPart(text[begin - 1])) {
            --begin;
        }
        std::size_t end = endOfRun(text, at + mark, isHost);
        while (end > at + mark && text[end - 1] == '.') {
            --end;
        }
        if (begin < at && end > at + mark) {
            found.push_back({begin, end - begin, SecretKind::email});
        }
    };
    for (std::size_t at = text.find('@'); at != std::string_view::npos;
         at = text.find('@', at + 1)) {
        check(at, 1);
    }
    constexpr std::string_view encoded = "%40";
    for (std::size_t at = text.find(encoded); at != std::string_view::npos;
         at = text.find(encoded, at + 1)) {
        check(at, encoded.size());
    }
}

/// Logins and passwords, and what names files, in URLs.
void findInUrls(std::string_view text, Found& found) {
    constexpr std::string_view mark = "://";
    const auto isUrl = [](char character) {
        return !isBlank(character) && !isQuote(character) && character != '<' && character != '>';
    };
    for (std::size_t at = text.find(mark); at != std::string_view::npos;
         at = text.find(mark, at + 1)) {
        const std::size_t begin = at + mark.size();
        const std::size_t end = endOfRun(text, begin, isUrl);
        const std::string_view url = text.substr(begin, end - begin);
        const std::size_t path = std::min(url.find_first_of("/?#"), url.size());
        // A password may hold what should end the host's name.
        const std::size_t login = url.rfind('@');
        if (login != std::string_view::npos) {
            const std::size_t behind = std::min(url.find_first_of("/?#", login), url.size());
            found.push_back({begin, behind, SecretKind::secret});
        }
        if (url.size() > path + 1) {
            found.push_back({begin + path, url.size() - path, SecretKind::path});
        }
    }
}

/// Whether the value before `index` ends there: another name and value follows.
bool startsNextPair(std::string_view text, std::size_t index) {
    if (!std::string_view(",;&").contains(text[index])) {
        return false;
    }
    const auto skip = [&text](std::size_t from) {
        return endOfRun(text, from, [](char character) {
            return isBlank(character) || isQuote(character) || character == '\\';
        });
    };
    const std::size_t name = skip(index + 1);
    const std::size_t end = endOfRun(text, name, [](char character) {
        return isWord(character) || character == '_' || character == '-' || character == '.';
    });
    const std::size_t sign = skip(end);
    return end > name && sign < text.size() && (text[sign] == '=' || text[sign] == ':');
}

/// The value that stands at `begin`, in quotation marks or without.
FoundSecret valueAt(std::string_view text, std::size_t begin, SecretKind kind) {
    const bool isEscaped = begin < text.size() && text[begin] == '\\';
    const std::size_t quote = begin + (isEscaped ? 1 : 0);
    if (quote < text.size() && isQuote(text[quote])) {
        const std::size_t first = quote + 1;
        std::size_t end = first;
        while (end < text.size() && text[end] != text[quote]) {
            // A quotation mark behind a backslash closes what one behind a backslash has opened.
            if (text[end] == '\\' && (!isEscaped || text.substr(end + 1, 1) != "\"")) {
                ++end;
            } else if (text[end] == '\\') {
                break;
            }
            ++end;
        }
        end = std::min(end, text.size());
        return {first, end - first, kind};
    }
    std::size_t end = begin;
    while (end < text.size() && !isBlank(text[end]) && !isQuote(text[end]) &&
           !startsNextPair(text, end)) {
        ++end;
    }
    while (end > begin && std::string_view(",;)]}").contains(text[end - 1])) {
        --end;
    }
    return {begin, end - begin, kind};
}

void findNamedValues(std::string_view text, Found& found) {
    const auto isName = [](char character) {
        return isWord(character) || character == '_' || character == '-' || character == '.';
    };
    for (std::size_t begin = 0; begin < text.size(); ++begin) {
        if (!isName(text[begin])) {
            continue;
        }
        const std::size_t end = endOfRun(text, begin, isName);
        const auto kind = kindOfValueNamed(text.substr(begin, end - begin));
        begin = end;
        if (!kind) {
            continue;
        }
        std::size_t sign = endOfRun(text, end, [](char character) {
            return isBlank(character) || isQuote(character) || character == '\\' ||
                   character == ']';
        });
        if (sign >= text.size() || (text[sign] != '=' && text[sign] != ':')) {
            continue;
        }
        sign = endOfRun(text, sign, [](char character) {
            return isBlank(character) || character == '=' || character == ':' || character == '>';
        });
        // Behind "Bearer" stands the value itself.
        const FoundSecret value = valueAt(text, sign, *kind);
        const std::string word = lowerCase(text.substr(value.begin, value.size));
        if (value.size > 0 && word != "bearer" && word != "basic" && word != "null" &&
            word != "true" && word != "false") {
            found.push_back(value);
        }
    }
}

void findBearers(std::string_view text, Found& found) {
    const std::string lower = lowerCase(text);
    for (const std::string_view scheme : {"bearer ", "basic ", "digest "}) {
        for (std::size_t at = lower.find(scheme); at != std::string::npos;
             at = lower.find(scheme, at + 1)) {
            const std::size_t begin = endOfRun(text, at + scheme.size() - 1, isBlank);
            const std::size_t end = endOfRun(text, begin, [](char character) {
                return isWord(character) || std::string_view("._~+/=-").contains(character);
            });
            constexpr std::size_t leastToken = 6;
            // "Basic settings" is none.
            const std::string_view token = text.substr(begin, end - begin);
            const bool isPlainWord =
                scheme != "bearer " && !std::ranges::any_of(token, isDigit) && !token.contains('=');
            if (token.size() >= leastToken && !isPlainWord) {
                found.push_back({begin, token.size(), SecretKind::secret});
            }
        }
    }
}

bool isHexadecimal(char character) {
    return isDigit(character) || (character >= 'a' && character <= 'f') ||
           (character >= 'A' && character <= 'F');
}

void findHexadecimals(std::string_view text, Found& found) {
    constexpr std::ptrdiff_t leastDigits = 16;
    for (std::size_t begin = 0; begin < text.size(); ++begin) {
        if (!isHexadecimal(text[begin]) || (begin > 0 && isHexadecimal(text[begin - 1]))) {
            continue;
        }
        std::size_t end = endOfRun(text, begin, [](char character) {
            return isHexadecimal(character) || character == '-' || character == ':';
        });
        while (!isHexadecimal(text[end - 1])) {
            --end;
        }
        const std::string_view run = text.substr(begin, end - begin);
        if (std::ranges::count_if(run, isHexadecimal) >= leastDigits &&
            std::ranges::any_of(run, isDigit)) {
            found.push_back({begin, run.size(), SecretKind::secret});
        }
        begin = end;
    }
}

int classOf(char character) {
    if (isDigit(character)) {
        return 0;
    }
    return isLower(character) ? 1 : 2;
}

/// Whether `run` is no words, whatever signs stand between them: small letters, capitals and digits
/// follow each other in no order, or letters and several digits are one long word.
bool looksRandom(std::string_view run) {
    std::size_t changes = 0;
    for (std::size_t index = 1; index < run.size(); ++index) {
        const bool isInWord = isWord(run[index]) && isWord(run[index - 1]);
        changes += isInWord && classOf(run[index]) != classOf(run[index - 1]) ? 1U : 0U;
    }
    const auto digits = std::ranges::count_if(run, isDigit);
    const bool isOneWord = std::ranges::all_of(run, isWord);
    return 3 * changes > run.size() || (isOneWord && digits >= 3);
}

void findEncoded(std::string_view text, Found& found) {
    constexpr std::size_t leastSize = 20;
    const auto isPart = [](char character) {
        return isWord(character) || std::string_view("+/_-").contains(character);
    };
    for (std::size_t begin = 0; begin < text.size();) {
        const std::size_t end = endOfRun(text, begin, isPart);
        const std::string_view run = text.substr(begin, end - begin);
        if (run.size() >= leastSize && looksRandom(run) &&
            std::ranges::any_of(run, [](char character) { return !isDigit(character); })) {
            const std::size_t padded =
                endOfRun(text, end, [](char character) { return character == '='; });
            found.push_back({begin, padded - begin, SecretKind::secret});
        }
        begin = std::max(end, begin + 1);
    }
}

/// What a message about a file quotes of it.
void findQuotations(std::string_view text, Found& found) {
    const std::size_t expected = text.find(": expected ");
    if (expected == std::string_view::npos) {
        return;
    }
    constexpr std::string_view mark = ", found ";
    const std::size_t at = text.find(mark, expected);
    if (at == std::string_view::npos || text.substr(at + mark.size()) == "nothing") {
        return;
    }
    const std::size_t begin = at + mark.size();
    const std::size_t end = std::min(text.find('\n', begin), text.size());
    found.push_back({begin, end - begin, SecretKind::text});
}

} // namespace

std::vector<FoundSecret> findSecrets(std::string_view text, std::string_view root) {
    // Of two that are found in the same place, the first tells best what it is.
    Found found;
    findPaths(text, root, found);
    findAddresses(text, found);
    findInUrls(text, found);
    findNamedValues(text, found);
    findBearers(text, found);
    findHexadecimals(text, found);
    findEncoded(text, found);
    findQuotations(text, found);
    findDocumentNames(text, found);
    std::erase_if(found, [](const FoundSecret& secret) { return secret.size == 0; });
    return found;
}

std::optional<SecretKind> kindOfValueNamed(std::string_view name) {
    constexpr std::array inSecretNames{
        "password",  "passwd",    "passphrase", "passcode",   "pwd",           "secret",
        "token",     "apikey",    "accesskey",  "privatekey", "authorization", "cookie",
        "sessionid", "signature", "bearer",     "credential", "encryptionkey"};
    constexpr std::array userNames{"user",     "username",  "login",     "owner",      "fullname",
                                   "lastname", "firstname", "loginname", "displayname"};
    std::string plain = lowerCase(name);
    const std::string last = plain.substr(plain.rfind('.') + 1);
    const auto dropSigns = [](std::string text) {
        std::erase_if(text, [](char character) { return !isWord(character); });
        return text;
    };
    plain = dropSigns(plain);
    if (std::ranges::any_of(inSecretNames,
                            [&plain](const char* part) { return plain.contains(part); })) {
        return SecretKind::secret;
    }
    const std::string word = dropSigns(last);
    if (std::ranges::find(userNames, word) != userNames.end()) {
        return SecretKind::user;
    }
    if (word == "accountname" || word == "accountid" || word == "accountidentifier") {
        return SecretKind::account;
    }
    if (word == "devicename" || word == "hostname" || word == "computername") {
        return SecretKind::device;
    }
    return std::nullopt;
}

} // namespace nimbra::mrctl
