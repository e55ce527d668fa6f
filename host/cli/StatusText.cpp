#include "host/cli/StatusText.h"

#include "host/cli/TextLayout.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <string_view>

namespace nimbra::cli {

namespace {

/// The text without the blanks that keep a line's place.
std::string wordsOf(const host::FooterDescription& footer) {
    const std::string words = printable(footer.text.string());
    const std::size_t first = words.find_first_not_of(' ');
    if (first == std::string::npos) {
        return {};
    }
    return words.substr(first, words.find_last_not_of(' ') - first + 1);
}

std::string percentage(float progress) {
    constexpr double hundred = 100;
    // A bar holds 0.53 as a little less than that.
    constexpr double tolerance = 1e-4;
    // Not rounded up: only what is complete shows as complete.
    const double most = progress < 1 ? hundred - 1 : hundred;
    const double whole = std::floor((static_cast<double>(progress) * hundred) + tolerance);
    return std::to_string(static_cast<int>(std::min(whole, most))) + " %";
}

std::string drawnBar(float progress) {
    constexpr std::size_t length = 20;
    const auto filled = static_cast<std::size_t>(progress * static_cast<float>(length));
    std::string bar = "[";
    bar.append(filled, '#');
    bar.append(length - filled, '-');
    return bar + ']';
}

/// `line`, cut between two characters where it is too long for `width` columns.
std::string cut(const std::string& line, std::size_t width) {
    if (displayWidth(line) <= width) {
        return line;
    }
    constexpr std::string_view ellipsis = "…";
    std::string kept;
    for (std::size_t place = 0; place < line.size();) {
        std::size_t end = place + 1;
        while (end < line.size() && (static_cast<unsigned char>(line[end]) & 0xC0U) == 0x80U) {
            ++end;
        }
        const std::string longer = kept + line.substr(place, end - place);
        if (displayWidth(longer) + 1 > width) {
            break;
        }
        kept = longer;
        place = end;
    }
    return kept.append(ellipsis);
}

} // namespace

std::string statusText(const host::FooterDescription& footer) {
    std::string words = wordsOf(footer);
    if (footer.barHidden) {
        return words;
    }
    return percentage(footer.barProgress) + (words.empty() ? "" : "  " + words);
}

std::string statusLine(const host::FooterDescription& footer, std::size_t width) {
    const std::string text = statusText(footer);
    return cut(footer.barHidden ? text : drawnBar(footer.barProgress) + ' ' + text, width);
}

} // namespace nimbra::cli
