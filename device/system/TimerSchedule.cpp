#include "device/system/TimerSchedule.h"

#include <algorithm>
#include <optional>
#include <tuple>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

using std::chrono::nanoseconds;

/// The end of time where the sum lies behind it. `duration` is not negative.
nanoseconds later(nanoseconds time, nanoseconds duration) {
    return time > nanoseconds::max() - duration ? nanoseconds::max() : time + duration;
}

} // namespace

class TimerSchedule::Timer : public std::enable_shared_from_this<Timer> {
public:
    explicit Timer(WorkQueue& calledQueue) : queue(calledQueue) {}

    WorkQueue& queue;
    Handler handler;
    /// Nothing until it is set, and when it was for once and has fallen due.
    std::optional<nanoseconds> deadline;
    nanoseconds interval{0};
    nanoseconds leeway{0};
    std::uint64_t order = 0;
    bool isResumed = false;
    /// A time has come that has not led to a call.
    bool isDue = false;
    /// A call is queued that has not started: it serves whatever is due by then.
    bool isQueued = false;
};

bool TimerSchedule::InOrder::operator()(const Timer* left, const Timer* right) const {
    return std::tie(left->deadline, left->order) < std::tie(right->deadline, right->order);
}

std::shared_ptr<TimerSchedule> TimerSchedule::over(std::shared_ptr<TimeSource> timeSource) {
    std::shared_ptr<TimerSchedule> schedule(new TimerSchedule(std::move(timeSource)));
    schedule->_timeSource->setWake([weakSchedule = std::weak_ptr(schedule)] {
        if (const auto alive = weakSchedule.lock()) {
            alive->wake();
        }
    });
    return schedule;
}

TimerSchedule::TimerSchedule(std::shared_ptr<TimeSource> timeSource)
    : _timeSource(std::move(timeSource)) {}

std::shared_ptr<TimerSchedule::Timer> TimerSchedule::add(WorkQueue& queue) {
    auto timer = std::make_shared<Timer>(queue);
    const std::scoped_lock lock(_mutex);
    if (!_isFinished) {
        _timers.insert(timer.get());
    }
    return timer;
}

void TimerSchedule::setHandler(Timer& timer, std::function<void()> handler) {
    // Declared before the lock: what the earlier handler captured is destroyed without it.
    auto exchanged = std::make_shared<std::function<void()>>(std::move(handler));
    const std::scoped_lock lock(_mutex);
    if (_timers.contains(&timer)) {
        timer.handler.swap(exchanged);
    }
}

void TimerSchedule::set(Timer& timer, const Setting& setting) {
    const std::scoped_lock lock(_mutex);
    if (!_timers.contains(&timer)) {
        return;
    }
    _running.erase(&timer);
    timer.deadline = later(_timeSource->elapsed(), std::max(setting.first, nanoseconds::zero()));
    timer.interval = setting.interval;
    timer.leeway = std::max(setting.leeway, nanoseconds::zero());
    timer.order = ++_settings;
    timer.isDue = false;
    if (timer.isResumed) {
        _running.insert(&timer);
    }
    update();
}

void TimerSchedule::resume(Timer& timer) {
    const std::scoped_lock lock(_mutex);
    if (!_timers.contains(&timer)) {
        return;
    }
    timer.isResumed = true;
    if (timer.isDue) {
        callSoon(timer);
    }
    if (timer.deadline) {
        _running.insert(&timer);
    }
    update();
}

void TimerSchedule::suspend(Timer& timer) {
    const std::scoped_lock lock(_mutex);
    if (!_timers.contains(&timer)) {
        return;
    }
    timer.isResumed = false;
    _running.erase(&timer);
    update();
}

void TimerSchedule::end(Timer& timer) {
    Handler released; // let go without the lock
    const std::scoped_lock lock(_mutex);
    if (_timers.contains(&timer)) {
        released = endAndTakeHandler(timer);
        update();
    }
}

void TimerSchedule::finish() {
    std::vector<Handler> released;
    {
        const std::scoped_lock lock(_mutex);
        if (std::exchange(_isFinished, true)) {
            return; // the source of time may be another one's by now
        }
        while (!_timers.empty()) {
            released.push_back(endAndTakeHandler(**_timers.begin()));
        }
        update();
    }
    _timeSource->setWake({});
}

void TimerSchedule::update() {
    bool willBeWoken = false;
    while (!willBeWoken) {
        const nanoseconds now = _timeSource->elapsed();
        while (!_running.empty() && *(*_running.begin())->deadline <= now) {
            fallDue(**_running.begin(), now);
        }
        willBeWoken = _timeSource->wakeAt(nextWake());
    }
}

void TimerSchedule::fallDue(Timer& timer, nanoseconds now) {
    _running.erase(&timer);
    if (timer.interval > nanoseconds::zero()) {
        // The next time of the timer's own grid: those that were missed are one with this.
        const nanoseconds sinceLast = (now - *timer.deadline) % timer.interval;
        timer.deadline = later(now - sinceLast, timer.interval);
        _running.insert(&timer);
    } else {
        timer.deadline.reset();
    }
    timer.isDue = true;
    callSoon(timer);
}

void TimerSchedule::callSoon(Timer& timer) {
    if (std::exchange(timer.isQueued, true)) {
        return;
    }
    // With the mutex held: who ends the timer may let its queue go right after. The queued call
    // owns nothing, so that letting the source go drops it.
    timer.queue.async([weakSchedule = weak_from_this(), weakTimer = timer.weak_from_this()] {
        const auto schedule = weakSchedule.lock();
        const auto called = weakTimer.lock();
        if (schedule && called) {
            schedule->call(*called);
        }
    });
}

std::optional<nanoseconds> TimerSchedule::nextWake() const {
    std::optional<nanoseconds> latest;
    for (const Timer* timer : _running) {
        if (latest && *timer->deadline >= *latest) {
            break;
        }
        const nanoseconds latestOfTimer = later(*timer->deadline, timer->leeway);
        latest = latest ? std::min(*latest, latestOfTimer) : latestOfTimer;
    }
    return latest;
}

TimerSchedule::Handler TimerSchedule::endAndTakeHandler(Timer& timer) {
    _running.erase(&timer);
    _timers.erase(&timer);
    timer.isResumed = false;
    return std::exchange(timer.handler, nullptr);
}

void TimerSchedule::wake() {
    const std::scoped_lock lock(_mutex);
    update();
}

void TimerSchedule::call(Timer& timer) {
    Handler handler; // kept while it runs, though it may end its timer
    {
        const std::scoped_lock lock(_mutex);
        timer.isQueued = false;
        if (!timer.isResumed || !timer.isDue) {
            return;
        }
        timer.isDue = false;
        handler = timer.handler;
    }
    if (handler && *handler) {
        (*handler)();
    }
}

} // namespace nimbra::device
