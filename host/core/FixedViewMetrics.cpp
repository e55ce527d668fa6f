#include "host/core/FixedViewMetrics.h"

#include "host/core/TextLines.h"

#include <cstddef>
#include <limits>

namespace nimbra::host {

namespace {

constexpr double kBodyPointSize = 17;
constexpr double kCaptionPointSize = 12;
constexpr double kProgressBarHeight = 4;
constexpr Size kActivityIndicatorSize{.width = 20, .height = 20};
constexpr double kButtonMargins = 12;

} // namespace

Font FixedViewMetrics::preferredFontForTextStyle(FontTextStyle style) const {
    return {.pointSize = style == FontTextStyleCaption1 ? kCaptionPointSize : kBodyPointSize};
}

double FixedViewMetrics::lineHeight(const Font& font) const {
    return font.pointSize * 6 / 5;
}

Size FixedViewMetrics::sizeOfText(const AttributedString& text, double width,
                                  int numberOfLines) const {
    if (text.runs().empty()) {
        return {};
    }
    TextLines lines(width > 0 ? width : 0, numberOfLines > 0
                                               ? static_cast<std::size_t>(numberOfLines)
                                               : std::numeric_limits<std::size_t>::max());
    for (const AttributedString::Run& run : text.runs()) {
        lines.add(run);
    }
    return lines.size();
}

double FixedViewMetrics::progressBarHeight() const {
    return kProgressBarHeight;
}

Size FixedViewMetrics::activityIndicatorSize() const {
    return kActivityIndicatorSize;
}

Size FixedViewMetrics::sizeOfButtonAround(const Size& title) const {
    return {.width = title.width, .height = title.height + kButtonMargins};
}

} // namespace nimbra::host
