#pragma once

#include "platform/values/Text.h"
#include "platform/views/AttributedString.h"
#include "platform/views/Color.h"
#include "platform/views/Font.h"
#include "platform/views/View.h"

#include <optional>

namespace nimbra {

/// A text that cannot be changed by the user. Another text, font or number of lines asks for a
/// layout; another colour or alignment does not.
class Label final : public View {
public:
    /// An empty label in the body font, black, at the left, on one line.
    Label(const PlatformServices& services, const Rect& frame);

    /// The text; of a styled one its letters.
    [[nodiscard]] const Text& text() const { return _text; }
    void setText(Text text);
    /// The text in its own attributes, where it has been given some.
    [[nodiscard]] const std::optional<AttributedString>& attributedText() const {
        return _attributedText;
    }
    /// Shows a styled text, whatever the label's own font; nothing for no text at all.
    void setAttributedText(std::optional<AttributedString> text);
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
    [[nodiscard]] AttributedString shownText() const;

    Text _text;
    std::optional<AttributedString> _attributedText;
    Font _font;
    Color _textColor = Color::black;
    TextAlignment _textAlignment = TextAlignment::left;
    int _numberOfLines = 1;
};

} // namespace nimbra
