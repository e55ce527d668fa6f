#include "host/core/FixedViewMetrics.h"

#include <algorithm>
#include <cmath>
#include <ranges>
#include <string_view>
#include <vector>

namespace nimbra::host {

namespace {

constexpr double kBodyPointSize = 17;
constexpr double kCaptionPointSize = 12;
constexpr double kProgressBarHeight = 4;

std::size_t codePointsIn(std::string_view utf8) {
    return static_cast<std::size_t>(std::ranges::count_if(utf8, [](char byte) {
        constexpr unsigned kindMask = 0xC0;
        constexpr unsigned continuation = 0x80;
        return (static_cast<unsigned char>(byte) & kindMask) != continuation;
    }));
}

/// How many characters fit a line; a layout's small rounding does not break it.
std::size_t charactersIn(double width, const Font& font) {
    constexpr double tolerance = 1e-6;
    constexpr double most = 1e9;
    const double fitting = std::floor((width / (font.pointSize / 2)) + tolerance);
    return fitting > 0 ? static_cast<std::size_t>(std::min(fitting, most)) : 0;
}

/// Adds the lengths of the lines into which a text without line feeds breaks.
void breakParagraph(std::string_view paragraph, std::size_t most, std::vector<std::size_t>& lines) {
    std::size_t line = 0;
    // Spaces that are kept only if something follows them on their line.
    std::size_t spaces = 0;
    bool isFirst = true;
    for (const auto part : std::views::split(paragraph, ' ')) {
        spaces += isFirst ? 0 : 1;
        isFirst = false;
        const std::size_t word = codePointsIn(std::string_view(part.begin(), part.end()));
        if (word == 0) {
            continue;
        }
        if (spaces > 0 && line + spaces + word > most) {
            lines.push_back(line);
            line = word;
        } else {
            line += spaces + word;
        }
        spaces = 0;
    }
    lines.push_back(std::max(line, std::min(line + spaces, most)));
}

std::vector<std::size_t> linesOf(std::string_view text, std::size_t most) {
    std::vector<std::size_t> lines;
    for (const auto part : std::views::split(text, '\n')) {
        breakParagraph(std::string_view(part.begin(), part.end()), most, lines);
    }
    return lines;
}

/// A multiple of the line's height, rounded once.
double heightOfLines(std::size_t count, const Font& font) {
    return static_cast<double>(count) * font.pointSize * 6 / 5;
}

} // namespace

Font FixedViewMetrics::preferredFontForTextStyle(FontTextStyle style) const {
    return {.pointSize = style == FontTextStyleCaption1 ? kCaptionPointSize : kBodyPointSize};
}

double FixedViewMetrics::lineHeight(const Font& font) const {
    return heightOfLines(1, font);
}

Size FixedViewMetrics::sizeOfText(const Text& text, const Font& font, double width,
                                  int numberOfLines) const {
    if (text.string().empty()) {
        return {};
    }
    std::vector<std::size_t> lines = linesOf(text.string(), charactersIn(width, font));
    if (numberOfLines > 0) {
        lines.resize(std::min(lines.size(), static_cast<std::size_t>(numberOfLines)));
    }
    return {.width = static_cast<double>(std::ranges::max(lines)) * font.pointSize / 2,
            .height = heightOfLines(lines.size(), font)};
}

double FixedViewMetrics::progressBarHeight() const {
    return kProgressBarHeight;
}

} // namespace nimbra::host
