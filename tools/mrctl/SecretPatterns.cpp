#include "tools/mrctl/SecretPatterns.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/DecodedText.h"
#include "tools/mrctl/DocumentNames.h"
#include "tools/mrctl/NamedValues.h"
#include "tools/mrctl/PathPatterns.h"
#include "tools/mrctl/TokenPatterns.h"

#include <algorithm>
#include <string>

namespace nimbra::mrctl {

namespace {

using Found = std::vector<FoundSecret>;

constexpr auto nowhere = std::string_view::npos;

bool isLocalPart(char character) {
    return isAlphanumeric(character) || isBeyondAscii(character) ||
           std::string_view(".!#$%&*+-=?^_{|}~'").contains(character);
}

bool isHost(char character) {
    return isAlphanumeric(character) || isBeyondAscii(character) || character == '.' ||
           character == '-';
}

/// The beginning of the name that stands before an address in angle brackets, if it does:
/// "Ann Lee <ann@example.com>".
std::size_t startOfFullName(std::string_view text, std::size_t begin) {
    if (begin < 2 || text[begin - 1] != '<') {
        return begin;
    }
    std::size_t start = begin - 1;
    while (start > 0) {
        std::size_t word = start;
        while (word > 0 && (isBlank(text[word - 1]) || isQuote(text[word - 1]))) {
            --word;
        }
        const std::size_t end = word;
        while (word > 0 && (isAlphanumeric(text[word - 1]) || isBeyondAscii(text[word - 1]) ||
                            std::string_view(".-'").contains(text[word - 1]))) {
            --word;
        }
        if (word == end || !(isUpper(text[word]) || isBeyondAscii(text[word]))) {
            break;
        }
        start = word;
    }
    return start;
}

/// Adds the address whose sign is the `size` bytes at `at`. Where `needsDot` is set, its host is
/// one of several parts.
void addAddress(std::string_view text, std::size_t at, std::size_t size, bool needsDot,
                Found& found) {
    std::size_t begin = at;
    if (begin > 1 && text[begin - 1] == '"') {
        const std::size_t open = text.rfind('"', begin - 2);
        begin = open == nowhere ? begin : open;
    }
    constexpr std::size_t longest = 255;
    while (begin > 0 && at - begin < longest && isLocalPart(text[begin - 1])) {
        --begin;
    }
    begin = endOfRun(text, begin, [](char character) { return character == '\''; });
    std::size_t end = endOfRun(text, at + size, isHost);
    if (text.substr(at + size, 1) == "[") {
        end = std::min(text.find(']', at), text.size() - 1) + 1;
    }
    while (end > at + size && text[end - 1] == '.') {
        --end;
    }
    const bool hasDot = text.substr(at + size, end - at - size).contains('.');
    if (begin < at && end > at + size && (hasDot || !needsDot)) {
        begin = startOfFullName(text, begin);
        found.push_back({.begin = begin, .size = end - begin, .kind = SecretKind::email});
    }
}

void findAddresses(std::string_view text, Found& found) {
    for (std::size_t at = text.find('@'); at != nowhere; at = text.find('@', at + 1)) {
        addAddress(text, at, 1, false, found);
    }
    for (std::size_t at = text.find("=40"); at != nowhere; at = text.find("=40", at + 1)) {
        if (at + 3 < text.size() && !isDigit(text[at + 3])) {
            addAddress(text, at, 3, true, found);
        }
    }
    const std::string lower = lowerCase(text);
    for (const std::string_view sign : {"(at)", "[at]", "{at}", "<at>", " at "}) {
        for (std::size_t at = lower.find(sign); at != nowhere; at = lower.find(sign, at + 1)) {
            std::size_t begin = at;
            while (begin > 0 && isBlank(text[begin - 1])) {
                --begin;
            }
            const std::size_t host = endOfRun(text, at + sign.size(), isBlank);
            const std::size_t end = endOfRun(text, host, isHost);
            // A word alone is one of an address only where another one follows.
            if (sign != " at " || lower.substr(end).starts_with(" dot ")) {
                addAddress(text, begin, host - begin, false, found);
            }
        }
    }
}

/// Logins and passwords, and what names files, in URLs.
void findInUrls(std::string_view text, Found& found) {
    constexpr std::string_view mark = "://";
    const auto isUrl = [](char character) {
        return !isBlank(character) && !isQuote(character) && character != '<' && character != '>';
    };
    for (std::size_t at = text.find(mark); at != nowhere;) {
        const std::size_t begin = at + mark.size();
        const std::size_t end = endOfRun(text, begin, isUrl);
        const std::string_view url = text.substr(begin, end - begin);
        const std::size_t path = std::min(url.find_first_of("/?#"), url.size());
        // A password may hold what should end the host's name.
        const std::size_t login = url.rfind('@');
        if (login != nowhere) {
            const std::size_t behind = std::min(url.find_first_of("/?#", login), url.size());
            found.push_back({.begin = begin, .size = behind, .kind = SecretKind::secret});
        }
        if (url.size() > path + 1) {
            found.push_back(
                {.begin = begin + path, .size = url.size() - path, .kind = SecretKind::path});
        }
        at = text.find(mark, std::max(end, at + 1));
    }
}

/// What a message about a file quotes of it.
void findQuotations(std::string_view text, Found& found) {
    const std::size_t expected = text.find(": expected ");
    if (expected == nowhere) {
        return;
    }
    constexpr std::string_view mark = ", found ";
    const std::size_t at = text.find(mark, expected);
    if (at == nowhere || text.substr(at + mark.size()) == "nothing") {
        return;
    }
    const std::size_t begin = at + mark.size();
    found.push_back({.begin = begin, .size = text.size() - begin, .kind = SecretKind::text});
}

Found findAsItStands(std::string_view text, std::string_view root) {
    // Of two that are found in the same place, the first tells best what it is.
    Found found;
    findPaths(text, root, found);
    findAddresses(text, found);
    findInUrls(text, found);
    findNamedValues(text, found);
    findTokens(text, found);
    findQuotations(text, found);
    findDocumentNames(text, found);
    std::erase_if(found, [](const FoundSecret& secret) { return secret.size == 0; });
    return found;
}

} // namespace

std::vector<FoundSecret> findSecrets(std::string_view text, std::string_view root) {
    // Values are numbers most of the time, and no pattern holds of a few digits.
    constexpr std::size_t fewDigits = 10;
    if (text.size() <= fewDigits && std::ranges::all_of(text, isDigit)) {
        return {};
    }
    Found found = findAsItStands(text, root);
    const DecodedText decoded(text);
    if (decoded.text == text) {
        return found;
    }
    for (const FoundSecret& secret : findAsItStands(decoded.text, root)) {
        const std::size_t begin = decoded.begins[secret.begin];
        const std::size_t end = decoded.ends[secret.begin + secret.size - 1];
        std::size_t searched = secret.searched;
        if (searched > 0 && searched < secret.size) {
            searched = decoded.ends[secret.begin + searched - 1] - begin;
        }
        found.push_back(
            {.begin = begin, .size = end - begin, .kind = secret.kind, .searched = searched});
    }
    return found;
}

} // namespace nimbra::mrctl
