#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace nimbra {

/// What a control can tell its targets; the numbers are the platform's.
enum class ControlEvent : std::uint16_t { touchUpInside = 64, valueChanged = 4096 };

/// Whom a control tells of what happens to it. Main queue only.
template <class Sender>
class ControlTargets {
public:
    using Action = std::function<void(const std::shared_ptr<Sender>& sender)>;

    /// Calls `action` on each `event` for as long as `target`, which is held weakly, is alive.
    void add(std::weak_ptr<void> target, Action action, ControlEvent event) {
        _entries.push_back({std::move(target), std::move(action), event});
    }

    /// Tells the targets in the order in which they were added; each is alive while it is told.
    void send(const std::shared_ptr<Sender>& sender, ControlEvent event) const {
        // A copy, as an action may add or let go of targets.
        for (const Entry& entry : std::vector(_entries)) {
            if (const auto alive = entry.target.lock(); alive && entry.event == event) {
                entry.action(sender);
            }
        }
    }

private:
    struct Entry {
        std::weak_ptr<void> target;
        Action action;
        ControlEvent event = ControlEvent::touchUpInside;
    };

    std::vector<Entry> _entries;
};

} // namespace nimbra
