#pragma once

#include "platform/values/Text.h"
#include "platform/views/Font.h"
#include "platform/views/Geometry.h"

namespace nimbra {

/// How large what a host draws comes out: the host's own fonts and controls. Main queue only.
class ViewMetrics {
public:
    virtual ~ViewMetrics() = default;

    /// The font in which the user reads texts of this kind.
    [[nodiscard]] virtual Font preferredFontForTextStyle(FontTextStyle style) const = 0;

    /// The height of one line of text.
    [[nodiscard]] virtual double lineHeight(const Font& font) const = 0;

    /// The room that `text` takes when its lines are broken to be at most `width` wide, in at most
    /// `numberOfLines` lines (0: as many as it takes). An absent or empty text takes none.
    [[nodiscard]] virtual Size sizeOfText(const Text& text, const Font& font, double width,
                                          int numberOfLines) const = 0;

    [[nodiscard]] virtual double progressBarHeight() const = 0;
};

} // namespace nimbra
