#include "device/system/MachineTime.h"

#include "device/system/DeviceWorkQueues.h"
#include "tests/support/PumpedQueue.h"

#include <algorithm>
#include <atomic>
#include <filesystem>
#include <future>
#include <gtest/gtest.h>
#include <latch>
#include <memory>
#include <system_error>
#include <utility>
#include <vector>

namespace nimbra::device {
namespace {

using std::chrono::milliseconds;
using std::chrono::nanoseconds;

/// How many timers of the machine this process has open.
std::ptrdiff_t timerCount() {
    return std::ranges::count_if(std::filesystem::directory_iterator("/proc/self/fd"),
                                 [](const std::filesystem::directory_entry& entry) {
                                     std::error_code closed;
                                     return read_symlink(entry.path(), closed) ==
                                            "anon_inode:[timerfd]";
                                 });
}

TEST(MachineTimeTest, ItNeverGoesBackAndKnowsTheDate) {
    const MachineTime time;
    const auto earlier = time.elapsed();
    const auto before = std::chrono::floor<Date::duration>(std::chrono::system_clock::now());

    EXPECT_GE(time.elapsed(), earlier);
    EXPECT_GE(time.now(), before);
}

TEST(MachineTimeTest, ItWakesNoEarlierThanTheDeadline) {
    MachineTime time;
    const nanoseconds deadline = time.elapsed() + milliseconds(1);
    std::promise<nanoseconds> woken;
    time.setWake([&time, &woken] { woken.set_value(time.elapsed()); });

    EXPECT_TRUE(time.wakeAt(deadline));

    EXPECT_GE(woken.get_future().get(), deadline);
}

TEST(MachineTimeTest, ADeadlineThatHasPassedComesAtOnce) {
    MachineTime time;
    std::promise<void> woken;
    time.setWake([&woken] { woken.set_value(); });

    EXPECT_TRUE(time.wakeAt(nanoseconds(0)));

    woken.get_future().wait();
}

TEST(MachineTimeTest, AnEarlierDeadlineTakesThePlaceOfALaterOne) {
    MachineTime time;
    std::promise<void> woken;
    time.setWake([&woken] { woken.set_value(); });

    EXPECT_TRUE(time.wakeAt(nanoseconds::max()));
    EXPECT_TRUE(time.wakeAt(time.elapsed()));

    woken.get_future().wait();
}

TEST(MachineTimeTest, ItAsksTheMachineFromTheFirstDeadlineToTheEndOfTheWaking) {
    const auto before = timerCount();
    MachineTime time;
    time.setWake([] {});
    EXPECT_TRUE(time.wakeAt(std::nullopt));
    EXPECT_EQ(timerCount(), before);

    EXPECT_TRUE(time.wakeAt(nanoseconds::max()));
    EXPECT_EQ(timerCount(), before + 1);

    time.setWake({});
    EXPECT_EQ(timerCount(), before);
}

TEST(MachineTimeTest, ItMayBeUsedAgainAfterItsEnd) {
    MachineTime time;
    time.setWake([] {});
    EXPECT_TRUE(time.wakeAt(nanoseconds::max()));
    time.setWake({});
    std::promise<void> woken;

    time.setWake([&woken] { woken.set_value(); });
    EXPECT_TRUE(time.wakeAt(nanoseconds(1)));

    woken.get_future().wait();
}

TEST(MachineTimeTest, ATimerCallsOnItsQueueAgainAndAgain) {
    test::PumpedQueue mainQueue("main");
    DeviceWorkQueues queues(mainQueue);
    const auto queue = queues.serialQueueWithLabel("timed");
    std::latch calls(3);
    int made = 0; // the queue's own
    const auto timer = queues.timerSourceOnQueue(*queue);
    timer->setEventHandler([&] {
        if (++made <= 3) {
            calls.count_down();
        }
    });

    timer->setTimer(nanoseconds(0), milliseconds(1), nanoseconds(0));
    timer->resume();

    calls.wait();
    queues.finish();
}

TEST(MachineTimeTest, APendingTimerIsNoWorkToDo) {
    test::PumpedQueue mainQueue("main");
    DeviceWorkQueues queues(mainQueue);
    const auto timer = queues.timerSourceOnQueue(mainQueue);

    timer->setTimer(std::chrono::hours(1), std::chrono::hours(1), nanoseconds(0));
    timer->resume();

    EXPECT_TRUE(queues.isIdle());
}

TEST(MachineTimeTest, TimersMayBeSetSuspendedAndCancelledWhileOthersFallDue) {
    constexpr int queueCount = 3;
    constexpr int rounds = 150;
    test::PumpedQueue mainQueue("main");
    std::atomic<int> lateCalls = 0;
    std::latch firstCalls(queueCount);
    {
        DeviceWorkQueues queues(mainQueue);
        std::vector<std::shared_ptr<WorkQueue>> timed;
        std::vector<std::shared_ptr<TimerEventSource>> tickers;
        for (int index = 0; index < queueCount; ++index) {
            const auto queue = timed.emplace_back(queues.serialQueueWithLabel("timed"));
            const auto ticker = tickers.emplace_back(queues.timerSourceOnQueue(*queue));
            ticker->setEventHandler([&firstCalls, isFirst = true]() mutable {
                if (std::exchange(isFirst, false)) {
                    firstCalls.count_down();
                }
            });
            ticker->setTimer(nanoseconds(0), nanoseconds(20'000), nanoseconds(0));
            ticker->resume();
        }
        for (int round = 0; round < rounds; ++round) {
            for (const auto& queue : timed) {
                queue->async([&queues, &lateCalls, &borrowed = *queue] {
                    const auto isOver = std::make_shared<bool>(false);
                    const auto timer = queues.timerSourceOnQueue(borrowed);
                    timer->setEventHandler([isOver, &lateCalls] { lateCalls += *isOver ? 1 : 0; });
                    timer->resume();
                    timer->setTimer(nanoseconds(0), nanoseconds(1'000), nanoseconds(500));
                    timer->suspend();
                    timer->resume();
                    timer->setTimer(nanoseconds(10'000), nanoseconds(0), nanoseconds(0));
                    *isOver = true;
                    timer->cancel();
                });
            }
        }
        firstCalls.wait();
        queues.finish();
    }
    EXPECT_EQ(lateCalls, 0);
}

} // namespace
} // namespace nimbra::device
