#pragma once

#include "device/system/TimeSource.h"

#include <mutex>

namespace nimbra::device {

/// A time that stands still and moves only when it is told to.
///
/// What falls due is queued, not run, when the time moves: who wants timers that such calls set to
/// have their turn goes from deadline to deadline and lets the queues run dry at each.
class StandingTime final : public TimeSource {
public:
    /// A time that stands at `start`.
    explicit StandingTime(Date start);

    /// How far the time has moved since the start.
    [[nodiscard]] std::chrono::nanoseconds elapsed() const override;
    [[nodiscard]] Date now() const override;
    void setWake(std::function<void()> wake) override;
    [[nodiscard]] bool wakeAt(std::optional<std::chrono::nanoseconds> deadline) override;

    /// Sets the date, as a person does: what lasts, lasts as long as before.
    void setNow(Date date);

    /// When something falls due next, as `elapsed` counts; nothing while no timer runs.
    [[nodiscard]] std::optional<std::chrono::nanoseconds> nextDeadline() const;

    /// Moves the time until `elapsed` is what is given here, never back. When it returns,
    /// everything due by then is queued: in the order of the deadlines, and of the setting of the
    /// timers where those are equal.
    void advanceTo(std::chrono::nanoseconds elapsed);
    /// Moves the time by `duration` in the same way.
    void advance(std::chrono::nanoseconds duration);

private:
    mutable std::mutex _mutex;
    Date _start;
    std::chrono::nanoseconds _elapsed{0};
    std::optional<std::chrono::nanoseconds> _deadline;
    std::function<void()> _wake;
};

} // namespace nimbra::device
