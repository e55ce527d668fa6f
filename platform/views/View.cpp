#include "platform/views/View.h"

#include "platform/system/Syslog.h"
#include "platform/views/ConstraintSolver.h"
#include "platform/views/ViewAnimations.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <string>
#include <syslog.h>
#include <utility>

namespace nimbra {

namespace {

[[noreturn]] void stopWith(const char* message) {
    std::fprintf(stderr, "%s\n", message);
    std::abort();
}

std::size_t indexOf(LayoutAxis axis) {
    return static_cast<std::size_t>(axis);
}

} // namespace

View::View(const PlatformServices& services, const Rect& frame)
    : _services(services), _frame(frame) {}

View::~View() {
    for (const std::shared_ptr<View>& view : std::exchange(_subviews, {})) {
        view->_superview = nullptr;
        if (view->_window != nullptr) {
            view->moveToWindow(nullptr);
        }
    }
}

void View::addSubview(std::shared_ptr<View> view) {
    if (!view) {
        stopWith("there is no view to be added");
    }
    if (isInside(*view)) {
        stopWith("a view cannot be added to itself or to what is in it");
    }
    View& added = *view;
    const bool moves = added._window != _window;
    if (moves) {
        added.tellOfMoveTo(_window);
    }
    added.leaveSuperview();
    _subviews.push_back(std::move(view));
    added._superview = this;
    if (moves) {
        added.setWindow(_window);
    }
    setNeedsLayout();
}

void View::removeFromSuperview() {
    if (_superview == nullptr) {
        return;
    }
    const std::shared_ptr<View> kept = shared_from_this();
    const bool moves = _window != nullptr;
    if (moves) {
        tellOfMoveTo(nullptr);
    }
    leaveSuperview();
    if (moves) {
        setWindow(nullptr);
    }
}

void View::leaveSuperview() {
    if (_superview == nullptr) {
        return;
    }
    View& left = *std::exchange(_superview, nullptr);
    std::erase_if(left._constraints, [this](const LayoutConstraint& constraint) {
        return constraint.firstItem == this || constraint.secondItem == this;
    });
    left.setNeedsLayout();
    std::erase_if(left._subviews, [this](const auto& view) { return view.get() == this; });
}

bool View::isInside(const View& view) const {
    const View* place = this;
    while (place != nullptr && place != &view) {
        place = place->_superview;
    }
    return place != nullptr;
}

void View::moveToWindow(Window* window) {
    tellOfMoveTo(window);
    setWindow(window);
}

void View::willMoveToWindow(Window* /*window*/) {}

// NOLINTNEXTLINE(misc-no-recursion): a tree
void View::tellOfMoveTo(Window* window) {
    willMoveToWindow(window);
    // A copy, as a view that is told may change the tree.
    for (const std::shared_ptr<View>& view : std::vector(_subviews)) {
        view->tellOfMoveTo(window);
    }
}

// NOLINTNEXTLINE(misc-no-recursion): a tree
void View::setWindow(Window* window) {
    _window = window;
    for (const std::shared_ptr<View>& view : _subviews) {
        view->setWindow(window);
    }
}

void View::setFrame(const Rect& frame) {
    if (frame.size != _frame.size) {
        setNeedsLayout();
    }
    _frame = frame;
}

void View::setAlpha(double alpha) {
    const double opacity = std::isnan(alpha) ? 0 : std::clamp(alpha, 0.0, 1.0);
    if (std::exchange(_alpha, opacity) == opacity) {
        return;
    }
    // A view that is still being made has nothing to show over time.
    if (auto self = weak_from_this().lock()) {
        _services.viewAnimations->didChangeAlpha(std::move(self), opacity);
    }
}

void View::sizeToFit() {
    const Size fitting = intrinsicContentSize();
    const auto orAsItIs = [](double needed, double current) {
        return needed == ViewNoIntrinsicMetric ? current : needed;
    };
    setFrame({.origin = _frame.origin,
              .size = {.width = orAsItIs(fitting.width, _frame.size.width),
                       .height = orAsItIs(fitting.height, _frame.size.height)}});
}

Size View::intrinsicContentSize() const {
    return {.width = ViewNoIntrinsicMetric, .height = ViewNoIntrinsicMetric};
}

double View::heightForWidth(double /*width*/) const {
    return intrinsicContentSize().height;
}

// NOLINTNEXTLINE(misc-no-recursion): a tree
void View::layoutIfNeeded() {
    if (std::exchange(_needsLayout, false)) {
        layoutSubviews();
    }
    for (const std::shared_ptr<View>& view : std::vector(_subviews)) {
        view->layoutIfNeeded();
    }
}

void View::layoutSubviews() {
    const ConstraintSolver solver(*this);
    for (const ConstraintSolver::Placement& placement : solver.placements()) {
        placement.view->setFrame(placement.frame);
    }
    const std::vector<std::string>& broken = solver.broken();
    if (!broken.empty()) {
        writeSyslog(LOG_WARNING, "a layout breaks " + std::to_string(broken.size()) +
                                     " required constraints, the first is " + broken.front());
    }
}

void View::addConstraints(std::vector<LayoutConstraint> constraints) {
    for (const LayoutConstraint& constraint : constraints) {
        if (!canHold(constraint)) {
            stopWith("a constraint does not fit the view that it is added to");
        }
    }
    std::ranges::move(constraints, std::back_inserter(_constraints));
    setNeedsLayout();
}

bool View::canHold(const LayoutConstraint& constraint) const {
    const auto isKnown = [this](const View* view) {
        return view == this || (view != nullptr && view->_superview == this);
    };
    if (!isKnown(constraint.firstItem) || constraint.firstAttribute == LayoutAttribute::none ||
        !std::isfinite(constraint.constant) || !(constraint.priority >= 0) ||
        !(constraint.priority <= requiredLayoutPriority)) {
        return false;
    }
    if (constraint.secondItem == nullptr) {
        return constraint.secondAttribute == LayoutAttribute::none;
    }
    return isKnown(constraint.secondItem) && constraint.secondAttribute != LayoutAttribute::none &&
           isHorizontal(constraint.firstAttribute) == isHorizontal(constraint.secondAttribute);
}

LayoutPriority View::contentCompressionResistancePriorityForAxis(LayoutAxis axis) const {
    return _compressionResistance.at(indexOf(axis));
}

void View::setContentCompressionResistancePriorityForAxis(LayoutPriority priority,
                                                          LayoutAxis axis) {
    _compressionResistance.at(indexOf(axis)) =
        std::isnan(priority) ? 0 : std::clamp(priority, LayoutPriority{0}, requiredLayoutPriority);
    if (_superview != nullptr) {
        _superview->setNeedsLayout();
    }
}

void View::observeValueForKeyPath(const KeyPath& keyPath, const Observation& /*observation*/) {
    writeSyslog(LOG_WARNING,
                "a view was told of \"" + keyPath.string() + "\", which it does not observe");
}

} // namespace nimbra
