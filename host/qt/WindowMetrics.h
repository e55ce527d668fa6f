#pragma once

#include "platform/views/AttributedString.h"
#include "platform/views/Font.h"
#include "platform/views/Geometry.h"
#include "platform/views/ViewMetrics.h"

#include <QFont>
#include <QString>

namespace nimbra::window {

/// The measures of a window: what its own fonts and controls take, in logical pixels. A `Font`
/// says its size before the user's text scale; this alone multiplies by it, for the styles and for
/// the sizes that a pane asks for by number. Main queue only.
class WindowMetrics final : public ViewMetrics {
public:
    /// How much larger than usual texts are, 1 at first. No number, or one that is not above 0,
    /// counts as 1. Who has laid out with the former scale lays out again.
    [[nodiscard]] double textScale() const { return _textScale; }
    void setTextScale(double scale);

    /// The very font that the window draws with where `font` is asked for: the application's
    /// family, in whole pixels, in the text scale.
    [[nodiscard]] QFont fontFor(const Font& font) const;

    /// What a rich `Text` element draws exactly as `sizeOfText` measures it: each line a paragraph
    /// of its own, fonts and spacing spelled out, everything in the text harmless. The element is
    /// at least `width` wide, does not wrap, and has no line height of its own. `mirrored` windows
    /// have their left at the right.
    [[nodiscard]] QString richText(const AttributedString& text, double width, int numberOfLines,
                                   bool mirrored = false) const;

    /// Body and caption, before the text scale.
    [[nodiscard]] Font preferredFontForTextStyle(FontTextStyle style) const override;
    [[nodiscard]] double lineHeight(const Font& font) const override;
    /// In whole points, rounded up. Breaks at line feeds and between words; blanks at the end of a
    /// line are dropped. A word that is wider than `width` is broken where it must be. What does
    /// not fit on `numberOfLines` is left out, with an ellipsis. The line spacing stands between
    /// two lines of a paragraph, the paragraph spacing behind each paragraph but the last.
    [[nodiscard]] Size sizeOfText(const AttributedString& text, double width,
                                  int numberOfLines) const override;
    [[nodiscard]] double progressBarHeight() const override;
    [[nodiscard]] Size activityIndicatorSize() const override;
    /// Large enough for a finger, whatever the title.
    [[nodiscard]] Size sizeOfButtonAround(const Size& title) const override;

private:
    double _textScale = 1;
};

} // namespace nimbra::window
