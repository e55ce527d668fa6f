#pragma once

#include "platform/values/Text.h"

#include <chrono>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace nimbra {

class View;

/// What changes on views over some time. The views have their new values at once: the time is for
/// whoever draws them.
struct ViewAnimation {
    struct Change {
        std::shared_ptr<View> view;
        /// The opacity that the view goes to.
        double alpha = 0;
    };

    Text name;
    /// As long as the platform's animations take where nobody says otherwise.
    std::chrono::duration<double> duration{0.2};
    /// In the order in which they were made.
    std::vector<Change> changes;
};

/// Gathers what is changed on the views of one host between a beginning and its end. Main queue
/// only.
class ViewAnimations {
public:
    /// What changes from here on belongs to the animation `name`, until it is committed. One that
    /// begins inside another ends first.
    void beginAnimations(Text name);
    /// How long the animation that began last takes; without one, nothing.
    void setAnimationDuration(std::chrono::duration<double> duration);
    /// Ends the animation that began last and hands it to the host.
    void commitAnimations();

    /// The view now has this opacity; what views tell when theirs changes. Outside an animation it
    /// is nothing to be shown over time.
    void didChangeAlpha(std::shared_ptr<View> view, double alpha);

    /// Is told of each animation when it is committed; for the host that shows it.
    void setObserver(std::function<void(const ViewAnimation&)> observer) {
        _observer = std::move(observer);
    }

private:
    /// Those that have begun, the outermost first.
    std::vector<ViewAnimation> _open;
    std::function<void(const ViewAnimation&)> _observer;
};

} // namespace nimbra
