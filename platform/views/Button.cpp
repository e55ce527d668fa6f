#include "platform/views/Button.h"

#include "platform/views/ViewMetrics.h"

#include <utility>

namespace nimbra {

std::shared_ptr<Button> Button::buttonWithType(ButtonType type, const PlatformServices& services) {
    return std::make_shared<Button>(type, services);
}

Button::Button(ButtonType type, const PlatformServices& services)
    : View(services, {}), _type(type), _titleLabel(std::make_shared<Label>(services, Rect())) {
    // A title has the lines that its text says.
    _titleLabel->setNumberOfLines(0);
}

void Button::setTitleForState(Text title, ControlState /*state*/) {
    const bool differs = title != _titleLabel->text();
    _titleLabel->setText(std::move(title));
    if (differs) {
        setNeedsLayout();
        if (superview() != nullptr) {
            superview()->setNeedsLayout();
        }
    }
}

const Text& Button::titleForState(ControlState /*state*/) const {
    return _titleLabel->text();
}

void Button::addTargetActionForControlEvents(std::weak_ptr<void> target, Action action,
                                             ControlEvent event) {
    _targets.add(std::move(target), std::move(action), event);
}

void Button::touch() {
    if (_enabled && isUserInteractionEnabled()) {
        _targets.send(std::static_pointer_cast<Button>(shared_from_this()),
                      ControlEvent::touchUpInside);
    }
}

Size Button::intrinsicContentSize() const {
    return services().viewMetrics->sizeOfButtonAround(_titleLabel->intrinsicContentSize());
}

} // namespace nimbra
