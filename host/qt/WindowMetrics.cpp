#include "host/qt/WindowMetrics.h"

#include "host/qt/BrokenText.h"

#include <QGuiApplication>
#include <algorithm>
#include <cmath>

namespace nimbra::window {

namespace {

constexpr double kBodyPointSize = 17;
constexpr double kCaptionPointSize = 12;
constexpr double kLargestPixelSize = 1000;
constexpr double kProgressBarHeight = 4;
constexpr double kActivityIndicatorLength = 20;
constexpr double kButtonSideMargin = 12;
constexpr double kButtonMargins = 12;
constexpr double kTouchableHeight = 44;

QFont::Weight weightFor(FontWeight weight) {
    switch (weight) {
    case FontWeight::thin:
        return QFont::Thin;
    case FontWeight::light:
        return QFont::Light;
    case FontWeight::bold:
        return QFont::Bold;
    case FontWeight::regular:
        break;
    }
    return QFont::Normal;
}

} // namespace

void WindowMetrics::setTextScale(double scale) {
    _textScale = std::isfinite(scale) && scale > 0 ? scale : 1;
}

QFont WindowMetrics::fontFor(const Font& font) const {
    const double pixels = std::round(font.pointSize * _textScale);
    QFont drawn = QGuiApplication::font();
    // A size of no number is the smallest.
    drawn.setPixelSize(pixels > 1 ? static_cast<int>(std::min(pixels, kLargestPixelSize)) : 1);
    drawn.setWeight(weightFor(font.weight));
    return drawn;
}

QString WindowMetrics::richText(const AttributedString& text, double width, int numberOfLines,
                                bool mirrored) const {
    return BrokenText(text, *this, width, numberOfLines).html(mirrored);
}

Font WindowMetrics::preferredFontForTextStyle(FontTextStyle style) const {
    return {.pointSize = style == FontTextStyleCaption1 ? kCaptionPointSize : kBodyPointSize};
}

double WindowMetrics::lineHeight(const Font& font) const {
    const AttributedString letter("x",
                                  {.FontAttributeName = font, .ParagraphStyleAttributeName = {}});
    return BrokenText(letter, *this, kLargestPixelSize, 1).size().height;
}

Size WindowMetrics::sizeOfText(const AttributedString& text, double width,
                               int numberOfLines) const {
    return BrokenText(text, *this, width, numberOfLines).size();
}

double WindowMetrics::progressBarHeight() const {
    return std::max(1.0, std::round(kProgressBarHeight * _textScale));
}

Size WindowMetrics::activityIndicatorSize() const {
    const double length = std::max(1.0, std::round(kActivityIndicatorLength * _textScale));
    return {.width = length, .height = length};
}

Size WindowMetrics::sizeOfButtonAround(const Size& title) const {
    return {.width = title.width + (2 * kButtonSideMargin),
            .height = std::max(title.height + kButtonMargins, kTouchableHeight)};
}

} // namespace nimbra::window
