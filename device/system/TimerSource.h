#pragma once

#include "device/system/TimerSchedule.h"
#include "platform/system/EventSource.h"

#include <memory>

namespace nimbra::device {

/// The source of kind timer over a schedule. Any thread; where it is used on its queue, no call
/// comes after `suspend` or `cancel`.
///
/// Letting it go ends it as `cancel` does. A handler that holds the source's owner keeps both until
/// `cancel` or until the schedule finishes.
class TimerSource final : public TimerEventSource {
public:
    /// A suspended source, not set, whose handler runs on `queue` (not owned, outlives it).
    TimerSource(std::shared_ptr<TimerSchedule> schedule, WorkQueue& queue);
    TimerSource(const TimerSource&) = delete;
    TimerSource& operator=(const TimerSource&) = delete;
    ~TimerSource() override;

    void setEventHandler(std::function<void()> handler) override;
    void resume() override;
    /// A negative `first` is now; an `interval` of zero or less is once.
    void setTimer(std::chrono::nanoseconds first, std::chrono::nanoseconds interval,
                  std::chrono::nanoseconds leeway) override;
    void suspend() override;
    void cancel() override;

private:
    std::shared_ptr<TimerSchedule> _schedule;
    std::shared_ptr<TimerSchedule::Timer> _timer;
};

} // namespace nimbra::device
