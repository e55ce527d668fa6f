#pragma once

#include "platform/values/Text.h"
#include "platform/views/Font.h"
#include "platform/views/View.h"

#include <cstdint>

namespace nimbra {

/// Where lines stand between the edges; the numbers are the platform's.
enum class TextAlignment : std::uint8_t { left = 0, center = 1, right = 2 };

/// The colours of the platform that texts stand in; a host chooses their shades.
enum class Color : std::uint8_t { black, gray };

/// A text that cannot be changed by the user. A change of what it shows asks for a layout.
class Label final : public View {
public:
    /// An empty label in the body font, black, at the left, on one line.
    Label(const PlatformServices& services, const Rect& frame);

    [[nodiscard]] const Text& text() const { return _text; }
    void setText(Text text);
    [[nodiscard]] const Font& font() const { return _font; }
    void setFont(const Font& font);
    [[nodiscard]] Color textColor() const { return _textColor; }
    void setTextColor(Color color) { _textColor = color; }
    [[nodiscard]] TextAlignment textAlignment() const { return _textAlignment; }
    void setTextAlignment(TextAlignment alignment) { _textAlignment = alignment; }
    /// How many lines the label may take; 0, or a number below, for as many as the text needs.
    [[nodiscard]] int numberOfLines() const { return _numberOfLines; }
    void setNumberOfLines(int lines);

    /// The height of one line in the label's font.
    [[nodiscard]] double lineHeight() const;

    /// The size of the text with its own line breaks only.
    [[nodiscard]] Size intrinsicContentSize() const override;
    [[nodiscard]] double heightForWidth(double width) const override;

private:
    /// The label has new measures, which concern the view that it stands in.
    void contentChanged();

    Text _text;
    Font _font;
    Color _textColor = Color::black;
    TextAlignment _textAlignment = TextAlignment::left;
    int _numberOfLines = 1;
};

} // namespace nimbra
