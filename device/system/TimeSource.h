#pragma once

#include "platform/values/Date.h"

#include <chrono>
#include <functional>
#include <optional>

namespace nimbra::device {

/// What a platform takes its time from: how long something lasts, what date it is, and a call when
/// a deadline has come. Any thread.
class TimeSource {
public:
    TimeSource() = default;
    TimeSource(const TimeSource&) = delete;
    TimeSource& operator=(const TimeSource&) = delete;
    virtual ~TimeSource() = default;

    /// The time since a moment that stays the same. It never goes back, whatever the date is set
    /// to, and goes on while the machine sleeps.
    [[nodiscard]] virtual std::chrono::nanoseconds elapsed() const = 0;

    [[nodiscard]] virtual Date now() const = 0;

    /// Calls `wake`, which is fast and on any thread, when `elapsed` has reached what `wakeAt` has
    /// set. There is one at a time. An empty one ends it, and the source's thread if it has one;
    /// so not within `wake`.
    virtual void setWake(std::function<void()> wake) = 0;

    /// Sets the deadline in place of the earlier one; none for nothing. False where the deadline
    /// has come already and nobody will be woken for it. Does not call `wake` itself, and may be
    /// used with locks held that `wake` takes.
    [[nodiscard]] virtual bool wakeAt(std::optional<std::chrono::nanoseconds> deadline) = 0;
};

} // namespace nimbra::device
