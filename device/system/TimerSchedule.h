#pragma once

#include "device/system/TimeSource.h"
#include "platform/system/WorkQueue.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <set>

namespace nimbra::device {

/// When which of a platform's timers falls due, over one source of time: never early. Any thread.
///
/// Calls are queued in the order of the deadlines, and of the setting of the timers where those are
/// equal. A timer is used only with the schedule that made it, and ended by its owner.
class TimerSchedule : public std::enable_shared_from_this<TimerSchedule> {
public:
    class Timer;
    struct Setting {
        /// Zero or less for now.
        std::chrono::nanoseconds first;
        /// Zero or less for once.
        std::chrono::nanoseconds interval;
        std::chrono::nanoseconds leeway;
    };

    /// The schedule over `timeSource`, which wakes no other one.
    [[nodiscard]] static std::shared_ptr<TimerSchedule>
    over(std::shared_ptr<TimeSource> timeSource);
    TimerSchedule(const TimerSchedule&) = delete;
    TimerSchedule& operator=(const TimerSchedule&) = delete;
    ~TimerSchedule() = default;

    /// A new timer, suspended and not set, that calls on `queue` (not owned, outlives it).
    [[nodiscard]] std::shared_ptr<Timer> add(WorkQueue& queue);

    void setHandler(Timer& timer, std::function<void()> handler);
    /// Replaces the earlier setting, and drops what fell due by it and has not been called.
    void set(Timer& timer, const Setting& setting);
    void resume(Timer& timer);
    void suspend(Timer& timer);
    /// Ends `timer`, which calls nothing more, and lets its handler go. Once is enough.
    void end(Timer& timer);

    /// Ends all timers, also those that are made later, and the source of time's calls. The
    /// handlers are let go on the calling thread, one that just runs when it has run.
    void finish();

private:
    struct InOrder {
        bool operator()(const Timer* left, const Timer* right) const;
    };
    using Handler = std::shared_ptr<std::function<void()>>;

    explicit TimerSchedule(std::shared_ptr<TimeSource> timeSource);

    // With the mutex held.
    void update();
    void fallDue(Timer& timer, std::chrono::nanoseconds now);
    void callSoon(Timer& timer);
    [[nodiscard]] std::optional<std::chrono::nanoseconds> nextWake() const;
    [[nodiscard]] Handler endAndTakeHandler(Timer& timer);

    void wake();
    void call(Timer& timer);

    const std::shared_ptr<TimeSource> _timeSource;
    std::mutex _mutex;
    /// Those that have not ended.
    std::set<Timer*> _timers;
    /// Those that run and have a deadline.
    std::set<Timer*, InOrder> _running;
    std::uint64_t _settings = 0;
    bool _isFinished = false;
};

} // namespace nimbra::device
