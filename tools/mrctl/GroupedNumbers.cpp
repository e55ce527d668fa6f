#include "tools/mrctl/GroupedNumbers.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/Pieces.h"

#include <algorithm>
#include <charconv>

namespace nimbra::mrctl {

namespace {

constexpr std::size_t digitGroup = 4;

bool beginsTelephone(char character) {
    return character == '+' || character == '(';
}

bool isOfTelephone(char character) {
    return isDigit(character) || std::string_view(" -+()/.").contains(character);
}

/// Where the number that may begin at `begin` ends, behind its last digit; `begin` for none.
std::size_t endOfGroupedNumber(std::string_view text, std::size_t begin) {
    const char first = text[begin];
    const bool isPhone = beginsTelephone(first);
    std::size_t end = begin;
    if (!isUpper(first)) {
        end = endOfRun(text, begin, [isPhone](char character) {
            return isPhone ? isOfTelephone(character)
                           : isDigit(character) || std::string_view(" -").contains(character);
        });
    } else if (text.size() > begin + digitGroup && isUpper(text[begin + 1]) &&
               isDigit(text[begin + 2]) && isDigit(text[begin + 3])) {
        // Two letters of a country, then groups.
        end = endOfRun(text, begin + 2,
                       [](char character) { return isDigit(character) || character == ' '; });
    }
    while (end > begin && !isDigit(text[end - 1])) {
        --end;
    }
    return end;
}

/// Whether all groups but the last are of four characters, and that is no longer.
bool areFours(const Pieces& groups) {
    return groups.size() >= 3 &&
           std::ranges::all_of(groups.begin(), groups.end() - 1,
                               [](auto part) { return part.size() == digitGroup; }) &&
           groups.back().size() <= digitGroup;
}

/// Numbers with a sign before them, and of cards and accounts.
void findSignedNumbers(std::string_view text, std::vector<FoundSecret>& found) {
    constexpr std::size_t leastDigits = 8;
    for (std::size_t begin = 0; begin < text.size(); ++begin) {
        const char first = text[begin];
        const bool isApart = begin == 0 || !isAlphanumeric(text[begin - 1]);
        const bool mayBegin = isApart && (beginsTelephone(first) || isAlphanumeric(first));
        const std::size_t end = mayBegin ? endOfGroupedNumber(text, begin) : begin;
        if (end == begin) {
            // Signs without a digit are not looked at from each of them on.
            begin = mayBegin && beginsTelephone(first) ? endOfRun(text, begin, isOfTelephone) - 1
                                                       : begin;
            continue;
        }
        const std::string_view run = text.substr(begin, end - begin);
        const auto digits = static_cast<std::size_t>(std::ranges::count_if(run, isDigit));
        if (beginsTelephone(first) ? digits >= leastDigits : areFours(piecesOf(run))) {
            found.push_back({.begin = begin, .size = run.size(), .kind = SecretKind::secret});
        }
        begin = end - 1;
    }
}

/// A group of digits, behind the sign that parts it from another one; none where it is empty.
struct Group {
    std::size_t begin = 0;
    std::size_t size = 0;
    char sign = ' ';

    [[nodiscard]] std::size_t end() const { return begin + size; }
};

/// Whether the digits before `end` belong to no word, no time and no number with a point.
bool endsGroup(std::string_view text, std::size_t end) {
    if (end == text.size()) {
        return true;
    }
    const bool goesOn = std::string_view(":.").contains(text[end]) && end + 1 < text.size() &&
                        isDigit(text[end + 1]);
    return !goesOn && !isAlphanumeric(text[end]) && !std::string_view("_%").contains(text[end]);
}

Group groupAt(std::string_view text, std::size_t begin, char sign) {
    const std::size_t end = endOfRun(text, begin, isDigit);
    return {.begin = begin, .size = endsGroup(text, end) ? end - begin : 0, .sign = sign};
}

/// The group behind the one that ends at `end`: behind a blank, "-" or "/", which may stand between
/// blanks.
Group nextGroup(std::string_view text, std::size_t end) {
    const std::string_view signs = text.substr(end, 3);
    if (signs == " - " || signs == " / ") {
        return groupAt(text, end + signs.size(), signs[1]);
    }
    const bool isParted = !signs.empty() && std::string_view(" -/").contains(signs[0]);
    return isParted ? groupAt(text, end + 1, signs[0]) : Group{};
}

int numberIn(std::string_view text, const Group& group) {
    int number = 0;
    const std::string_view digits = text.substr(group.begin, group.size);
    std::from_chars(digits.data(), digits.data() + digits.size(), number);
    return number;
}

/// The end of the date whose first group is `first`; where that begins if it is none. The year is
/// first or last, and of two digits in the latter case only.
std::size_t endOfDate(std::string_view text, const Group& first) {
    const Group second = nextGroup(text, first.end());
    const Group third = nextGroup(text, second.end());
    if (second.size == 0 || third.size == 0 || second.sign != third.sign) {
        return first.begin;
    }
    const bool isYearFirst = first.size == 4;
    const Group& year = isYearFirst ? first : third;
    const Group& other = isYearFirst ? third : first;
    const auto isYear = [&](int least, int most) {
        return numberIn(text, year) >= least && numberIn(text, year) <= most;
    };
    const bool areShort = second.size <= 2 && other.size <= 2;
    const int day = std::max(numberIn(text, second), numberIn(text, other));
    const int month = std::min(numberIn(text, second), numberIn(text, other));
    const bool isInYear = areShort && month >= 1 && month <= 12 && day <= 31;
    const bool hasYear = (year.size == 4 && isYear(1900, 2099)) ||
                         (year.size == 2 && !isYearFirst && second.sign != ' ');
    // The next group would be one of the same number.
    const Group behind = nextGroup(text, third.end());
    const bool goesOn = behind.size > 0 && behind.sign == third.sign;
    return isInYear && hasYear && !goesOn ? third.end() : first.begin;
}

/// Whether a telephone's number may begin at `begin`, a digit behind none.
bool mayBeginTelephone(std::string_view text, std::size_t begin) {
    if (begin == 0) {
        return true;
    }
    const char before = text[begin - 1];
    const char second = begin > 1 ? text[begin - 2] : ' ';
    if (isAlphanumeric(before) || std::string_view("+/").contains(before)) {
        return false;
    }
    // "tel.0170", but "1.0170" and "backup-0170".
    return !(std::string_view("-_").contains(before) && isAlphanumeric(second)) &&
           !(std::string_view(":.").contains(before) && isDigit(second));
}

/// The end of a number that begins with 0; where it begins if it is none.
std::size_t endOfNationalNumber(std::string_view text, const Group& first) {
    constexpr std::size_t leastDigits = 8;
    constexpr std::size_t leastPrefix = 2;
    constexpr std::size_t mostPrefix = 6;
    if (text[first.begin] != '0' || first.size < leastPrefix || first.size > mostPrefix) {
        return first.begin;
    }
    std::size_t digits = first.size;
    std::size_t end = first.end();
    for (Group group = nextGroup(text, end); group.size > 0; group = nextGroup(text, end)) {
        if (group.sign == ' ' && endOfDate(text, group) > group.begin) {
            break;
        }
        digits += group.size;
        end = group.end();
    }
    return digits >= leastDigits && end > first.end() ? end : first.begin;
}

/// The end of "555-123-4567", with or without a 1 before it; where it begins if it is none.
std::size_t endOfAmericanNumber(std::string_view text, const Group& first) {
    const bool hasPrefix = first.size == 1 && text[first.begin] == '1';
    const Group area = hasPrefix ? nextGroup(text, first.end()) : first;
    const Group exchange = nextGroup(text, area.end());
    const Group line = nextGroup(text, exchange.end());
    const bool hasSizes = area.size == 3 && exchange.size == 3 && line.size == 4;
    const Group behind = nextGroup(text, line.end());
    const bool goesOn = behind.size > 0 && behind.sign == '-';
    const bool hasSigns = exchange.sign != '/' && line.sign == '-';
    return hasSizes && hasSigns && !goesOn ? line.end() : first.begin;
}

/// Numbers of telephones without a sign before them.
void findTelephones(std::string_view text, std::vector<FoundSecret>& found) {
    for (std::size_t begin = 0; begin < text.size();) {
        if (!isDigit(text[begin])) {
            ++begin;
            continue;
        }
        const Group first = groupAt(text, begin, ' ');
        std::size_t end = endOfRun(text, begin, isDigit);
        if (first.size > 0 && mayBeginTelephone(text, begin)) {
            const std::size_t date = endOfDate(text, first);
            const std::size_t number =
                std::max(endOfNationalNumber(text, first), endOfAmericanNumber(text, first));
            if (date == begin && number > begin) {
                found.push_back(
                    {.begin = begin, .size = number - begin, .kind = SecretKind::secret});
            }
            end = std::max({end, date, date == begin ? number : date});
        }
        begin = end;
    }
}

} // namespace

void findGroupedNumbers(std::string_view text, std::vector<FoundSecret>& found) {
    findSignedNumbers(text, found);
    findTelephones(text, found);
}

} // namespace nimbra::mrctl
