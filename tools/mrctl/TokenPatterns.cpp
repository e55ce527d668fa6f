#include "tools/mrctl/TokenPatterns.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/GroupedNumbers.h"
#include "tools/mrctl/NetworkAddresses.h"
#include "tools/mrctl/Pieces.h"

#include <algorithm>
#include <array>
#include <string>

namespace nimbra::mrctl {

namespace {

using Found = std::vector<FoundSecret>;

/// Fewer characters are no token.
constexpr std::size_t leastToken = 12;

bool isVowel(char character) {
    return std::string_view("aeiouAEIOU").contains(character);
}

int classOf(char character) {
    if (isDigit(character)) {
        return 0;
    }
    return isLower(character) ? 1 : 2;
}

/// How many times letters, capitals and digits follow each other in `run`, signs aside.
std::size_t changesIn(std::string_view run) {
    std::size_t changes = 0;
    for (std::size_t index = 1; index < run.size(); ++index) {
        const bool isInWord = isAlphanumeric(run[index]) && isAlphanumeric(run[index - 1]);
        changes += isInWord && classOf(run[index]) != classOf(run[index - 1]) ? 1U : 0U;
    }
    return changes;
}

std::size_t longestWithoutVowel(std::string_view letters) {
    std::size_t longest = 0;
    std::size_t current = 0;
    for (const char character : letters) {
        current = isVowel(character) ? 0 : current + 1;
        longest = std::max(longest, current);
    }
    return longest;
}

/// Whether `letters`, eight or more, are no word and no words in one.
bool isCodeOfLetters(std::string_view letters) {
    constexpr std::size_t longWord = 16;
    const std::size_t changes = changesIn(letters);
    if (letters.size() >= leastToken && std::ranges::all_of(letters, isHexadecimal)) {
        return true;
    }
    const auto vowels = static_cast<std::size_t>(std::ranges::count_if(letters, isVowel));
    if (changes <= 1 && letters.size() >= longWord) {
        return longestWithoutVowel(letters) >= (letters.size() > 20 ? 5 : 6) ||
               4 * vowels < letters.size();
    }
    if (changes <= 1) {
        return false;
    }
    return 100 * changes > 36 * (letters.size() - 1) || 4 * vowels < letters.size() ||
           longestWithoutVowel(letters) >= 7;
}

/// Whether `piece`, of letters and digits alone, is no word, no number and no words in one.
bool isCode(std::string_view piece) {
    constexpr std::size_t leastCode = 8;
    constexpr std::size_t longNumber = 11;
    const auto digits = static_cast<std::size_t>(std::ranges::count_if(piece, isDigit));
    if (digits == piece.size()) {
        return digits >= longNumber;
    }
    if (piece.size() < leastCode) {
        return false;
    }
    if (digits > 0) {
        // "Scanner2" and "100ms" are words.
        const std::string_view withoutEnd =
            piece.substr(0, piece.find_last_not_of("0123456789") + 1);
        const bool endsInNumber = withoutEnd.size() + digits == piece.size();
        return !endsInNumber || digits > 4 ||
               (withoutEnd.size() >= leastCode && isCodeOfLetters(withoutEnd));
    }
    return isCodeOfLetters(piece);
}

/// "2024-03-05", whatever follows.
bool isDate(std::string_view run) {
    constexpr std::string_view form = "0000-00-00";
    return run.size() >= form.size() &&
           std::ranges::equal(run.substr(0, form.size()), form, [](char character, char expected) {
               return expected == '0' ? isDigit(character) : character == expected;
           });
}

/// Groups of as many characters each, as people are to copy them: "fmij-hjtq-eflw-hlbp".
bool isGrouped(std::string_view run, const Pieces& pieces) {
    constexpr std::size_t leastGroups = 3;
    constexpr std::size_t leastGroup = 3;
    constexpr std::size_t mostGroup = 8;
    const std::size_t size = pieces.front().size();
    const bool areEqual =
        std::ranges::all_of(pieces, [size](auto piece) { return piece.size() == size; });
    return areEqual && pieces.size() >= leastGroups && size >= leastGroup && size <= mostGroup &&
           std::ranges::count(run, '-') + 1 == static_cast<std::ptrdiff_t>(pieces.size());
}

/// Eight, four, four, four and twelve hexadecimal digits, and the like.
bool isHexadecimalGroups(const Pieces& pieces) {
    std::size_t digits = 0;
    for (const std::string_view piece : pieces) {
        if (!std::ranges::all_of(piece, isHexadecimal)) {
            return false;
        }
        digits += piece.size();
    }
    return digits >= 2 * leastToken || (digits >= leastToken && pieces.size() == 1 &&
                                        std::ranges::any_of(pieces.front(), isLetter));
}

bool isToken(std::string_view run) {
    const Pieces pieces = piecesOf(run);
    if (pieces.empty() || isDate(run)) {
        return false;
    }
    const bool isNumber = std::ranges::all_of(run, isDigit);
    if (run.size() < leastToken) {
        return isNumber && isCode(run);
    }
    if (isGrouped(run, pieces) || isHexadecimalGroups(pieces) ||
        std::ranges::any_of(pieces, isCode)) {
        return true;
    }
    // Signs of base64 part a token into pieces that are words by chance.
    const bool hasSigns = run.find_first_of("+/=_-~") != std::string_view::npos;
    const bool isMixed = std::ranges::any_of(run, isLower) && std::ranges::any_of(run, isUpper);
    return hasSigns && (3 * changesIn(run) > run.size() || (isMixed && run.contains('+')));
}

void findRuns(std::string_view text, Found& found) {
    const auto isPart = [](char character) {
        return isAlphanumeric(character) || std::string_view("-_+/=.~").contains(character);
    };
    for (std::size_t begin = 0; begin < text.size();) {
        if (!isAlphanumeric(text[begin])) {
            ++begin;
            continue;
        }
        std::size_t end = endOfRun(text, begin, isPart);
        const std::size_t next = end;
        while (text[end - 1] == '.' || text[end - 1] == '-') {
            --end;
        }
        // What is named does not belong to its name: "serial=C02XK1ZZJGH5".
        std::size_t start = begin;
        for (std::size_t sign = text.find('=', start);
             sign < end && isAlphanumeric(text[std::min(sign + 1, end - 1)]);
             sign = text.find('=', start)) {
            if (isToken(text.substr(start, sign - start))) {
                found.push_back({.begin = start, .size = sign - start, .kind = SecretKind::secret});
            }
            start = sign + 1;
        }
        if (isToken(text.substr(start, end - start))) {
            found.push_back({.begin = start, .size = end - start, .kind = SecretKind::secret});
        }
        begin = next;
    }
}

/// What begins like a token of a well-known service, to the next blank or quotation mark.
void findPrefixed(std::string_view text, Found& found) {
    constexpr std::array<std::string_view, 24> starts{
        "xoxa-",  "xoxb-",   "xoxp-",   "xoxr-",       "xoxs-",   "xapp-", "AKIA", "ASIA",
        "glpat-", "sk_live", "sk_test", "pk_live",     "rk_live", "sk-",   "ghp_", "gho_",
        "ghu_",   "ghs_",    "ghr_",    "github_pat_", "eyJ",     "AIza",  "npm_", "SG."};
    constexpr std::size_t leastRest = 8;
    for (const std::string_view start : starts) {
        for (std::size_t at = text.find(start); at != std::string_view::npos;) {
            const std::size_t end = endOfRun(text, at, [](char character) {
                return !isBlank(character) && !isQuote(character);
            });
            const bool isInside = at > 0 && isAlphanumeric(text[at - 1]);
            if (!isInside && end - at >= start.size() + leastRest) {
                found.push_back({.begin = at, .size = end - at, .kind = SecretKind::secret});
            }
            at = text.find(start, end);
        }
    }
}

} // namespace

void findTokens(std::string_view text, std::vector<FoundSecret>& found) {
    findRuns(text, found);
    findPrefixed(text, found);
    findNetworkAddresses(text, found);
    findGroupedNumbers(text, found);
}

} // namespace nimbra::mrctl
