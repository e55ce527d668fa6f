#include "platform/views/RefreshControl.h"

#include <utility>

namespace nimbra {

void RefreshControl::addTargetActionForControlEvents(std::weak_ptr<void> target, Action action,
                                                     ControlEvent event) {
    _targets.add(std::move(target), std::move(action), event);
}

void RefreshControl::pull() {
    if (_refreshing) {
        return;
    }
    _refreshing = true;
    _targets.send(shared_from_this(), ControlEvent::valueChanged);
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
