#pragma once

#include "platform/values/Text.h"

#include <optional>
#include <utility>

namespace nimbra {

/// A button of the bar above a screen.
struct BarButtonItem {
    Text title;
};

/// What the bar above a screen shows for it. Main queue only.
class NavigationItem {
public:
    [[nodiscard]] const std::optional<BarButtonItem>& leftBarButtonItem() const { return _left; }
    [[nodiscard]] const std::optional<BarButtonItem>& rightBarButtonItem() const { return _right; }
    void setLeftBarButtonItem(std::optional<BarButtonItem> item) { _left = std::move(item); }
    void setRightBarButtonItem(std::optional<BarButtonItem> item) { _right = std::move(item); }

private:
    std::optional<BarButtonItem> _left;
    std::optional<BarButtonItem> _right;
};

} // namespace nimbra
