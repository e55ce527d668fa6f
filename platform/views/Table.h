#pragma once

#include "platform/views/RefreshControl.h"

#include <memory>
#include <utility>

namespace nimbra {

/// The table in which the host shows a controller's rows. Main queue only.
class Table {
public:
    /// The sign of a list that can be pulled down; null where it cannot.
    [[nodiscard]] const std::shared_ptr<RefreshControl>& refreshControl() const {
        return _refreshControl;
    }
    void setRefreshControl(std::shared_ptr<RefreshControl> control) {
        _refreshControl = std::move(control);
    }

private:
    std::shared_ptr<RefreshControl> _refreshControl;
};

} // namespace nimbra
