#include "platform/views/ViewAnimations.h"

#include "platform/views/View.h"

#include <utility>

namespace nimbra {

void ViewAnimations::beginAnimations(Text name) {
    _open.push_back({.name = std::move(name), .changes = {}});
}

void ViewAnimations::setAnimationDuration(std::chrono::duration<double> duration) {
    if (!_open.empty()) {
        _open.back().duration = duration;
    }
}

void ViewAnimations::commitAnimations() {
    if (_open.empty()) {
        return;
    }
    const ViewAnimation animation = std::move(_open.back());
    _open.pop_back();
    if (_observer) {
        _observer(animation);
    }
}

void ViewAnimations::didChangeAlpha(std::shared_ptr<View> view, double alpha) {
    if (!_open.empty()) {
        _open.back().changes.push_back({.view = std::move(view), .alpha = alpha});
    }
}

} // namespace nimbra
