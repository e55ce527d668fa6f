#include "tools/mrctl/NetworkAddresses.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/Pieces.h"

#include <algorithm>

namespace nimbra::mrctl {

namespace {

bool isOfAddress(char character) {
    return isHexadecimal(character) || std::string_view(":.-").contains(character);
}

bool isAllDigits(std::string_view text) {
    return !text.empty() && std::ranges::all_of(text, isDigit);
}

/// "10.1.2.3", of any digits.
bool isQuad(std::string_view host) {
    constexpr std::size_t octets = 4;
    constexpr std::size_t mostDigits = 3;
    const Pieces parts = piecesOf(host);
    return parts.size() == octets && std::ranges::count(host, '.') == 3 &&
           std::ranges::all_of(parts, [](std::string_view part) {
               return part.size() <= mostDigits && isAllDigits(part);
           });
}

bool isHostWithDots(std::string_view run) {
    constexpr std::size_t mostDigitsOfPort = 5;
    const std::string_view host = run.substr(0, run.find(':'));
    const std::string_view port = run.substr(std::min(host.size() + 1, run.size()));
    const bool hasPort = isAllDigits(port) && port.size() <= mostDigitsOfPort;
    // "1.2.3.4" is a version.
    return isQuad(host) && (hasPort || host.find('.') > 1);
}

/// Six pairs, with "-" between them.
bool isCard(std::string_view run) {
    const Pieces pairs = piecesOf(run);
    return pairs.size() == 6 &&
           std::ranges::all_of(pairs, [](auto pair) { return pair.size() == 2; }) &&
           std::ranges::count(run, '-') == 5;
}

/// Whether `group` is the first one of a network at home, or of one cable: "fdab", "fe80".
bool beginsLocalNetwork(std::string_view group) {
    constexpr std::size_t digits = 4;
    const std::string start = lowerCase(group.substr(0, 3));
    return group.size() == digits && (start.starts_with("fc") || start.starts_with("fd") ||
                                      (start >= "fe8" && start <= "feb"));
}

/// "2001:db8::1" and the like, where groups of zeros are left out: there is "::" once. A group with
/// a digit tells it from names of letters, and so do three groups, as no name has both ":" and "::"
/// in it. "dead::beef" stays: only local networks have addresses of letters, and types are called
/// so.
bool isShortened(std::string_view run) {
    constexpr std::size_t mostGroups = 7;
    constexpr std::size_t mostDigits = 4;
    const std::size_t gap = run.find("::");
    if (gap == std::string_view::npos || run.find("::", gap + 1) != std::string_view::npos ||
        (gap > 0 && run.starts_with(':'))) {
        return false;
    }
    std::string_view groups = run;
    if (const std::size_t last = run.rfind(':') + 1; isQuad(run.substr(last))) {
        groups = run.substr(0, last);
    }
    const Pieces pieces = piecesOf(groups);
    const bool areGroups =
        groups.find_first_of(".-") == std::string_view::npos && pieces.size() <= mostGroups &&
        std::ranges::all_of(pieces, [](auto group) { return group.size() <= mostDigits; });
    return areGroups && (std::ranges::any_of(run, isDigit) || pieces.size() > 2 ||
                         beginsLocalNetwork(run.substr(0, gap)));
}

/// `run` without the signs of a sentence around it.
std::string_view withoutSigns(std::string_view run) {
    const auto isSign = [](char character) { return character == '.' || character == '-'; };
    while (!run.empty() && isSign(run.front())) {
        run.remove_prefix(1);
    }
    while (!run.empty() && (isSign(run.back()) || (run.ends_with(':') && (!run.ends_with("::") ||
                                                                          run.ends_with(":::"))))) {
        run.remove_suffix(1);
    }
    return run;
}

/// What of `run` stands behind the word that it begins in: "peer:fe80::1".
std::string_view behindWord(std::string_view run) {
    const std::size_t colon = run.find(':');
    return colon == std::string_view::npos || run.substr(colon).starts_with("::")
               ? std::string_view()
               : run.substr(colon + 1);
}

/// Whether `run` is an address in any form that needs no "::".
bool isWhole(std::string_view run) {
    constexpr std::ptrdiff_t manyColons = 4;
    const bool hasManyColons = std::ranges::count(run, ':') >= manyColons &&
                               (std::ranges::any_of(run, isDigit) || !run.contains("::"));
    return hasManyColons || isHostWithDots(run) || isCard(run);
}

} // namespace

void findNetworkAddresses(std::string_view text, std::vector<FoundSecret>& found) {
    for (std::size_t begin = 0; begin < text.size();) {
        const std::size_t end = endOfRun(text, begin, isOfAddress);
        const bool isInWord = begin > 0 && isAlphanumeric(text[begin - 1]);
        const bool isApart = end == text.size() || !isAlphanumeric(text[end]);
        const std::string_view all = text.substr(begin, end - begin);
        const std::string_view run = withoutSigns(isInWord ? behindWord(all) : all);
        if (isApart && (isShortened(run) || isWhole(run))) {
            const auto start = static_cast<std::size_t>(run.data() - text.data());
            std::size_t behind = start + run.size();
            // The zone may hold the address of a network card.
            if (behind < text.size() && text[behind] == '%') {
                behind = endOfRun(text, behind + 1, isAlphanumeric);
            }
            found.push_back({.begin = start, .size = behind - start, .kind = SecretKind::secret});
        }
        begin = std::max(end, begin + 1);
    }
}

} // namespace nimbra::mrctl
