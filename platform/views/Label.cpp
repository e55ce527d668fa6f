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
    const bool differs = text != _text;
    _text = std::move(text);
    if (differs) {
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
    return services().viewMetrics->sizeOfText(_text, _font, std::numeric_limits<double>::infinity(),
                                              _numberOfLines);
}

double Label::heightForWidth(double width) const {
    return services().viewMetrics->sizeOfText(_text, _font, width, _numberOfLines).height;
}

void Label::contentChanged() {
    setNeedsLayout();
    if (superview() != nullptr) {
        superview()->setNeedsLayout();
    }
}

} // namespace nimbra
