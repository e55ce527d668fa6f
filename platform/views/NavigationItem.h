#pragma once

#include "platform/values/Text.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <utility>

namespace nimbra {

/// Buttons that are the same on every screen: the host knows what they are called.
enum class BarButtonSystemItem : std::uint8_t { done, cancel };

/// A button of the bar above a screen.
struct BarButtonItem {
    /// Absent for a system item.
    Text title;
    std::optional<BarButtonSystemItem> systemItem;
    /// What a tap calls; empty for nothing. The host calls it on a copy of the item, as the screen
    /// may take the item away, or go itself, meanwhile.
    std::function<void(const BarButtonItem& sender)> action;
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
