#include "platform/views/Label.h"

#include "platform/views/ViewMetrics.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace nimbra {

Label::Label(const PlatformServices& services, const Rect& frame)
    : View(services, frame),
      _font(services.viewMetrics->preferredFontForTextStyle(FontTextStyleBody)) {}

void Label::setText(Text text) {
    const bool differs = text != _text || _attributedText;
    _text = std::move(text);
    _attributedText.reset();
    if (differs) {
        contentChanged();
    }
}

void Label::setAttributedText(std::optional<AttributedString> text) {
    if (text ? text != _attributedText : _text.isPresent()) {
        _text = text ? Text(text->string()) : Text();
        _attributedText = std::move(text);
        contentChanged();
    }
}

void Label::setFont(const Font& font) {
    if (font != _font) {
        _font = font;
        contentChanged();
    }
}

void Label::setNumberOfLines(int lines) {
    const int most = std::max(lines, 0);
    if (most != _numberOfLines) {
        _numberOfLines = most;
        contentChanged();
    }
}

double Label::lineHeight() const {
    return services().viewMetrics->lineHeight(_font);
}

Size Label::intrinsicContentSize() const {
    return services().viewMetrics->sizeOfText(shownText(), std::numeric_limits<double>::infinity(),
                                              _numberOfLines);
}

double Label::heightForWidth(double width) const {
    return services().viewMetrics->sizeOfText(shownText(), width, _numberOfLines).height;
}

AttributedString Label::shownText() const {
    return _attributedText ? *_attributedText
                           : AttributedString(_text, {.FontAttributeName = _font,
                                                      .ParagraphStyleAttributeName = {}});
}

void Label::contentChanged() {
    setNeedsLayout();
    if (superview() != nullptr) {
        superview()->setNeedsLayout();
    }
}

} // namespace nimbra
