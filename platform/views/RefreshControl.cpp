#include "platform/views/RefreshControl.h"

#include <utility>

namespace nimbra {

void RefreshControl::addTargetActionForControlEvents(std::weak_ptr<void> target, Action action,
                                                     ControlEvent event) {
    _targets.push_back({std::move(target), std::move(action), event});
}

void RefreshControl::pull() {
    if (_refreshing) {
        return;
    }
    _refreshing = true;
    for (const Target& entry : std::vector(_targets)) {
        if (const auto alive = entry.target.lock();
            alive && entry.event == ControlEvent::valueChanged) {
            entry.action(shared_from_this());
        }
    }
}

void RefreshControl::endRefreshing() {
    _refreshing = false;
    if (_endObserver) {
        _endObserver();
    }
}

void RefreshControl::setEndObserver(std::function<void()> observer) {
    _endObserver = std::move(observer);
}

} // namespace nimbra
