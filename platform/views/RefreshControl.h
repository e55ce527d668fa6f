#pragma once

#include "platform/views/ControlTargets.h"

#include <functional>
#include <memory>

namespace nimbra {

/// The sign that a pulled-down list shows while its content is fetched. Main queue only.
class RefreshControl : public std::enable_shared_from_this<RefreshControl> {
public:
    using Action = ControlTargets<RefreshControl>::Action;

    /// Calls `action` on each `event` for as long as `target`, which is held weakly, is alive.
    void addTargetActionForControlEvents(std::weak_ptr<void> target, Action action,
                                         ControlEvent event);

    /// Shows the sign and tells the targets of `valueChanged`: what the host does when the user
    /// pulls the list down. Nothing while a refresh is under way.
    void pull();

    /// Hides the sign.
    void endRefreshing();

    [[nodiscard]] bool isRefreshing() const { return _refreshing; }

    /// Is told of each call of `endRefreshing`; for the host that shows the control.
    void setEndObserver(std::function<void()> observer);

private:
    ControlTargets<RefreshControl> _targets;
    std::function<void()> _endObserver;
    bool _refreshing = false;
};

} // namespace nimbra
