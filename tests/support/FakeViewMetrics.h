#pragma once

#include "platform/views/ViewMetrics.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace nimbra::test {

/// Captions of 12 points, body texts of 17. A text is one line in the font of its first byte that
/// is broken wherever it is full, every byte of it `characterWidth` wide.
class FakeViewMetrics final : public ViewMetrics {
public:
    [[nodiscard]] Font preferredFontForTextStyle(FontTextStyle style) const override {
        return {.pointSize = style == FontTextStyleCaption1 ? captionPointSize : bodyPointSize};
    }
    [[nodiscard]] double lineHeight(const Font& font) const override {
        return captionLineHeight * (font.pointSize / captionPointSize);
    }
    [[nodiscard]] Size sizeOfText(const AttributedString& text, double width,
                                  int numberOfLines) const override {
        measured.push_back({.text = text, .width = width});
        if (text.runs().empty()) {
            return {};
        }
        const Font& font = text.runs().front().attributes.FontAttributeName;
        const auto length = static_cast<double>(text.string().size());
        const double perLine = std::clamp(std::floor(width / characterWidth), 1.0, length);
        double lines = std::ceil(length / perLine);
        if (numberOfLines > 0) {
            lines = std::min(lines, static_cast<double>(numberOfLines));
        }
        return {.width = perLine * characterWidth, .height = lines * lineHeight(font)};
    }
    [[nodiscard]] double progressBarHeight() const override { return barHeight; }
    [[nodiscard]] Size activityIndicatorSize() const override { return {20, 20}; }
    [[nodiscard]] Size sizeOfButtonAround(const Size& title) const override {
        return {.width = title.width, .height = title.height + 12};
    }

    struct Measurement {
        AttributedString text;
        double width;
    };
    /// What was measured, in order.
    mutable std::vector<Measurement> measured;

    /// The height of a line of the caption; other fonts have theirs in proportion.
    double captionLineHeight = 14.4;
    double bodyPointSize = 17;
    double barHeight = 4;
    double characterWidth = 6;

private:
    static constexpr double captionPointSize = 12;
};

} // namespace nimbra::test
