#pragma once

#include "platform/views/AttributedString.h"
#include "platform/views/Font.h"
#include "platform/views/Geometry.h"

namespace nimbra {

/// How large what a host draws comes out: the host's own fonts and controls, in points. Main
/// queue only.
class ViewMetrics {
public:
    virtual ~ViewMetrics() = default;

    /// The font in which the user reads texts of this kind.
    [[nodiscard]] virtual Font preferredFontForTextStyle(FontTextStyle style) const = 0;

    /// The height of one line of text.
    [[nodiscard]] virtual double lineHeight(const Font& font) const = 0;

    /// The room that `text` takes, from the top of its first line to the bottom of its last, when
    /// they are broken to be at most `width` points wide, in at most `numberOfLines` lines (0: as
    /// many as it takes). An empty text takes none. A width below 0, or of no number, is one of 0.
    [[nodiscard]] virtual Size sizeOfText(const AttributedString& text, double width,
                                          int numberOfLines) const = 0;

    [[nodiscard]] virtual double progressBarHeight() const = 0;
    [[nodiscard]] virtual Size activityIndicatorSize() const = 0;
    /// A button around a title of this size.
    [[nodiscard]] virtual Size sizeOfButtonAround(const Size& title) const = 0;
};

} // namespace nimbra
