#include "device/system/TimerSource.h"

#include "tests/device/system/TimerFixture.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::device {
namespace {

using std::chrono::hours;
using std::chrono::nanoseconds;
using std::chrono::seconds;

using TimerSourceTest = test::TimerFixture;

TEST_F(TimerSourceTest, ATimerFallsDueAfterTheFirstDelayAndThenEveryInterval) {
    for (const auto& [first, times] : {std::pair(seconds(60), Times{60, 120, 180}),
                                       std::pair(seconds(1), Times{1, 61, 121, 181}),
                                       std::pair(seconds(2), Times{2, 62, 122, 182}),
                                       std::pair(seconds(59), Times{59, 119, 179})}) {
        const auto begin = time().elapsed();
        const auto count = calls().size();
        const auto timer = runningTimer(first, seconds(60));

        advance(seconds(182));

        Times seen(calls().begin() + static_cast<std::ptrdiff_t>(count), calls().end());
        std::ranges::for_each(
            seen, [&](auto& call) { call -= std::chrono::floor<seconds>(begin).count(); });
        EXPECT_EQ(seen, times);
    }
}

TEST_F(TimerSourceTest, ItNeverFallsDueEarly) {
    const auto timer = runningTimer(seconds(1), seconds(60));

    advance(seconds(1) - nanoseconds(1));
    EXPECT_EQ(calls(), Times{});
    advance(nanoseconds(1));
    EXPECT_EQ(calls(), Times{1});
    advance(seconds(60) - nanoseconds(1));
    EXPECT_EQ(calls(), Times{1});
    advance(nanoseconds(1));

    EXPECT_EQ(calls(), (Times{1, 61}));
}

TEST_F(TimerSourceTest, ItIsMadeSuspendedAndNotSet) {
    const auto timer = makeTimer();
    timer->setEventHandler(noting());

    timer->setTimer(seconds(1), seconds(0), nanoseconds(0));
    advance(seconds(10));
    EXPECT_EQ(calls(), Times{});
    EXPECT_EQ(time().nextDeadline(), std::nullopt);

    const auto unset = makeTimer();
    unset->setEventHandler(noting());
    unset->resume();
    advance(seconds(10));
    EXPECT_EQ(calls(), Times{});
}

TEST_F(TimerSourceTest, WithoutAnIntervalItFallsDueOnce) {
    const auto zero = runningTimer(seconds(1), seconds(0));
    const auto negative = runningTimer(seconds(2), seconds(-60));

    advance(seconds(300));

    EXPECT_EQ(calls(), (Times{1, 2}));
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
}

TEST_F(TimerSourceTest, AFirstDelayOfZeroOrLessIsNow) {
    const auto zero = runningTimer(seconds(0), seconds(0));
    const auto negative = runningTimer(seconds(-5), seconds(60));
    EXPECT_EQ(calls(), Times{});

    queue().pump();
    EXPECT_EQ(calls(), (Times{0, 0}));
    advance(seconds(60));

    EXPECT_EQ(calls(), (Times{0, 0, 60}));
}

TEST_F(TimerSourceTest, TimesThatFallDueWhileItIsSuspendedLeadToOneCall) {
    const auto timer = runningTimer(seconds(60), seconds(60));
    advance(seconds(60));

    timer->suspend();
    advance(seconds(600));
    EXPECT_EQ(calls(), Times{60});
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
    timer->resume();
    advance(seconds(60));

    EXPECT_EQ(calls(), (Times{60, 660, 720}));
}

TEST_F(TimerSourceTest, ResumingBeforeTheTimeHasComeChangesNothing) {
    const auto timer = runningTimer(seconds(60), seconds(60));

    advance(seconds(30));
    timer->suspend();
    timer->resume();
    advance(seconds(40));

    EXPECT_EQ(calls(), Times{60});
}

TEST_F(TimerSourceTest, TimesThatFallDueWhileTheQueueIsBusyLeadToOneCall) {
    const auto timer = runningTimer(seconds(60), seconds(60));

    time().advance(seconds(60));
    time().advance(seconds(60));
    time().advance(seconds(90));
    EXPECT_EQ(queue().pendingCount(), 1U);
    queue().pump();
    EXPECT_EQ(calls(), Times{210});
    advance(seconds(30));

    EXPECT_EQ(calls(), (Times{210, 240}));
}

TEST_F(TimerSourceTest, ACallThatHasNotStartedWaitsForTheResumptionToo) {
    const auto timer = runningTimer(seconds(60), seconds(60));

    time().advance(seconds(60));
    timer->suspend();
    queue().pump();
    EXPECT_EQ(calls(), Times{});
    timer->resume();
    queue().pump();

    EXPECT_EQ(calls(), Times{60});
}

TEST_F(TimerSourceTest, SettingItAgainReplacesWhatWasSet) {
    const auto timer = runningTimer(seconds(60), seconds(60));
    advance(seconds(59));

    timer->setTimer(seconds(2), seconds(10), nanoseconds(0));
    advance(seconds(15));

    EXPECT_EQ(calls(), (Times{61, 71}));
}

TEST_F(TimerSourceTest, SettingItAgainDropsACallThatHasNotStarted) {
    const auto timer = runningTimer(seconds(60), seconds(60));

    time().advance(seconds(60));
    timer->setTimer(seconds(5), seconds(0), nanoseconds(0));
    queue().pump();
    EXPECT_EQ(calls(), Times{});
    advance(seconds(5));

    EXPECT_EQ(calls(), Times{65});
}

TEST_F(TimerSourceTest, TheHandlerMaySetItsTimerAgain) {
    const auto timer = makeTimer();
    timer->setEventHandler([this, note = noting(), &timer] {
        note();
        if (calls().size() < 4) {
            timer->setTimer(seconds(calls().size()), seconds(0), nanoseconds(0));
        }
    });
    timer->setTimer(seconds(10), seconds(100), nanoseconds(0));
    timer->resume();

    advance(seconds(1'000));

    EXPECT_EQ(calls(), (Times{10, 11, 13, 16}));
}

TEST_F(TimerSourceTest, TheHandlerMayCancelItsTimerAndRunsToItsEnd) {
    const auto timer = makeTimer();
    const auto held = std::make_shared<int>(7);
    int seen = 0;
    timer->setEventHandler([&timer, &seen, held] {
        timer->cancel();
        seen += *held;
    });
    timer->setTimer(seconds(1), seconds(1), nanoseconds(0));
    timer->resume();

    advance(seconds(10));

    EXPECT_EQ(seen, 7);
    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
}

TEST_F(TimerSourceTest, CancellingLetsTheHandlerGoAndIsForGood) {
    const auto timer = makeTimer();
    const auto held = std::make_shared<int>(0);
    timer->setEventHandler([held] { ++*held; });
    timer->setTimer(seconds(1), seconds(1), nanoseconds(0));
    timer->resume();
    time().advance(seconds(1));

    timer->cancel();
    EXPECT_EQ(held.use_count(), 1);
    timer->setEventHandler([held] { ++*held; });
    EXPECT_EQ(held.use_count(), 1);
    timer->setTimer(seconds(0), seconds(1), nanoseconds(0));
    timer->resume();
    timer->cancel();
    advance(seconds(10));

    EXPECT_EQ(*held, 0);
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
}

TEST_F(TimerSourceTest, LettingItGoEndsItWhetherItRunsOrIsSuspended) {
    const auto held = std::make_shared<int>(0);
    auto running = runningTimer(seconds(1), seconds(1));
    running->setEventHandler([held] { ++*held; });
    auto suspended = runningTimer(seconds(1), seconds(1));
    suspended->setEventHandler([held] { ++*held; });
    suspended->suspend();
    time().advance(seconds(1));

    running.reset();
    suspended.reset();
    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
    queue().pump();

    EXPECT_EQ(*held, 0);
}

TEST_F(TimerSourceTest, AHandlerThatLetsItsTimerGoRunsToItsEnd) {
    auto timer = makeTimer();
    const auto held = std::make_shared<int>(7);
    int seen = 0;
    timer->setEventHandler([&timer, &seen, held] {
        timer.reset();
        seen += *held;
    });
    timer->setTimer(seconds(1), seconds(1), nanoseconds(0));
    timer->resume();

    advance(seconds(10));

    EXPECT_EQ(seen, 7);
    EXPECT_EQ(held.use_count(), 1);
}

TEST_F(TimerSourceTest, TimersAreCalledInTheOrderOfTheirTimesAndThenOfTheirSetting) {
    std::string order;
    std::vector<std::shared_ptr<TimerEventSource>> timers;
    for (const auto& [name, first] :
         {std::pair('c', 3), std::pair('a', 2), std::pair('b', 2), std::pair('d', 3)}) {
        const auto& timer = timers.emplace_back(makeTimer());
        timer->setEventHandler([&order, name] { order += name; });
        timer->setTimer(seconds(first), seconds(10), nanoseconds(0));
    }
    // The order of resuming is of no account.
    std::ranges::for_each(timers.rbegin(), timers.rend(), [](auto& timer) { timer->resume(); });

    time().advance(seconds(5));
    queue().pump();
    EXPECT_EQ(order, "abcd");
    time().advance(seconds(10));
    queue().pump();

    EXPECT_EQ(order, "abcdabcd");
}

TEST_F(TimerSourceTest, ThousandsOfTimersFallDueInOrder) {
    constexpr int count = 5'000;
    std::vector<int> order;
    std::vector<std::shared_ptr<TimerEventSource>> timers;
    for (int index = 0; index < count; ++index) {
        const int second = (index * 7919) % count;
        const auto& timer = timers.emplace_back(makeTimer());
        timer->setEventHandler([&order, second] { order.push_back(second); });
        timer->setTimer(seconds(second), seconds(0), nanoseconds(0));
        timer->resume();
    }

    time().advance(seconds(count));
    queue().pump();

    EXPECT_EQ(order.size(), static_cast<std::size_t>(count));
    EXPECT_TRUE(std::ranges::is_sorted(order));
}

TEST_F(TimerSourceTest, LeewayLetsTimersFallDueTogetherButNeverEarlyOrTooLate) {
    const auto patient = makeTimer();
    patient->setEventHandler(noting());
    patient->setTimer(seconds(10), seconds(0), seconds(5));
    patient->resume();
    EXPECT_EQ(time().nextDeadline(), seconds(15));

    const auto strict = runningTimer(seconds(12), seconds(0));
    EXPECT_EQ(time().nextDeadline(), seconds(12));
    advance(seconds(11));
    EXPECT_EQ(calls(), Times{});
    advance(seconds(1));

    EXPECT_EQ(calls(), (Times{12, 12}));
}

TEST_F(TimerSourceTest, TimesBehindTheEndOfTimeNeverCome) {
    const auto timer = makeTimer();
    timer->setEventHandler(noting());
    timer->resume();
    advance(seconds(1));

    timer->setTimer(nanoseconds::max(), nanoseconds::max(), nanoseconds::max());
    advance(hours(1'000));
    EXPECT_EQ(calls(), Times{});
    timer->setTimer(seconds(1), nanoseconds::max(), nanoseconds::max());
    advance(hours(1'000));

    EXPECT_TRUE(time().nextDeadline());
}

} // namespace
} // namespace nimbra::device
