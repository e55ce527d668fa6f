#pragma once

#include "device/system/DeviceWorkQueues.h"
#include "device/system/StandingTime.h"
#include "tests/support/PumpedQueue.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra::test {

/// Timers over a time that stands until a test moves it, on a queue that a test pumps.
class TimerFixture : public testing::Test {
public:
    using Times = std::vector<std::int64_t>;

protected:
    [[nodiscard]] std::shared_ptr<TimerEventSource> makeTimer() {
        return _queues->timerSourceOnQueue(_queue);
    }
    /// A running timer that notes the times of its calls, in seconds.
    [[nodiscard]] std::shared_ptr<TimerEventSource> runningTimer(std::chrono::seconds first,
                                                                 std::chrono::seconds interval) {
        auto timer = makeTimer();
        timer->setEventHandler(noting());
        timer->setTimer(first, interval, std::chrono::nanoseconds(0));
        timer->resume();
        return timer;
    }
    [[nodiscard]] std::function<void()> noting() {
        return [this] {
            _calls.push_back(std::chrono::floor<std::chrono::seconds>(_time->elapsed()).count());
        };
    }
    /// Goes from deadline to deadline, so that every call is made in its time.
    void advance(std::chrono::nanoseconds duration) {
        const std::chrono::nanoseconds target = _time->elapsed() + duration;
        _queue.pump();
        for (auto next = _time->nextDeadline(); next && *next <= target;
             next = _time->nextDeadline()) {
            _time->advanceTo(*next);
            _queue.pump();
        }
        _time->advanceTo(target);
        _queue.pump();
    }

    [[nodiscard]] const Times& calls() const { return _calls; }
    [[nodiscard]] device::StandingTime& time() { return *_time; }
    [[nodiscard]] test::PumpedQueue& queue() { return _queue; }
    [[nodiscard]] device::DeviceWorkQueues& queues() { return *_queues; }
    void endQueues() { _queues.reset(); }

private:
    std::shared_ptr<device::StandingTime> _time =
        std::make_shared<device::StandingTime>(Date(std::chrono::hours(400'000)));
    test::PumpedQueue _queue{"main"};
    std::optional<device::DeviceWorkQueues> _queues{std::in_place, _queue, _time};
    Times _calls;
};

} // namespace nimbra::test
