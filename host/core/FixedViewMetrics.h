#pragma once

#include "platform/views/ViewMetrics.h"

namespace nimbra::host {

/// The measures of a host without a screen: every character half as wide as the font is large, a
/// line 1.2 times as high, so that a layout can be checked by hand. Any thread.
class FixedViewMetrics final : public ViewMetrics {
public:
    [[nodiscard]] Font preferredFontForTextStyle(FontTextStyle style) const override;
    [[nodiscard]] double lineHeight(const Font& font) const override;
    /// Breaks at each line feed and, where a line would pass `width`, at spaces, which are dropped.
    /// A word that is wider than `width` stands alone on its line. A line is as high as the tallest
    /// character left on it; an empty one as the line feed before it. The line spacing stands
    /// between two lines of a paragraph, the paragraph spacing behind each paragraph but the last.
    [[nodiscard]] Size sizeOfText(const AttributedString& text, double width,
                                  int numberOfLines) const override;
    [[nodiscard]] double progressBarHeight() const override;
    [[nodiscard]] Size activityIndicatorSize() const override;
    [[nodiscard]] Size sizeOfButtonAround(const Size& title) const override;
};

} // namespace nimbra::host
