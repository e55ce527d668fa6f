#include "tests/device/system/TimerFixture.h"

#include <gtest/gtest.h>
#include <memory>
#include <utility>

namespace nimbra::device {
namespace {

using std::chrono::nanoseconds;
using std::chrono::seconds;

using TimerShutdownTest = test::TimerFixture;

/// An object that owns its timer and is held by the timer's handler.
struct Owner {
    std::shared_ptr<TimerEventSource> timer;
    int calls = 0;
};

std::weak_ptr<Owner> ownerOfTimer(std::shared_ptr<TimerEventSource> timer) {
    const auto owner = std::make_shared<Owner>(std::move(timer));
    owner->timer->setEventHandler([owner] { ++owner->calls; });
    owner->timer->setTimer(seconds(60), seconds(60), nanoseconds(0));
    owner->timer->resume();
    return owner;
}

TEST_F(TimerShutdownTest, AHandlerThatHoldsTheOwnerIsLetGoWhenThePlatformShutsDown) {
    const auto running = ownerOfTimer(makeTimer());
    const auto suspended = ownerOfTimer(makeTimer());
    suspended.lock()->timer->suspend();
    const auto queued = ownerOfTimer(makeTimer());
    queued.lock()->timer->setTimer(seconds(0), seconds(0), nanoseconds(0));
    ASSERT_FALSE(running.expired() || suspended.expired() || queued.expired());

    queues().finish();

    EXPECT_TRUE(running.expired());
    EXPECT_TRUE(suspended.expired());
    EXPECT_TRUE(queued.expired());
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
    queue().pump();
}

TEST_F(TimerShutdownTest, AfterTheShutdownTimersCallNothingAndHoldNothing) {
    const auto earlier = runningTimer(seconds(1), seconds(1));
    queues().finish();
    const auto held = std::make_shared<int>(0);
    const auto late = makeTimer();

    for (const auto& timer : {earlier, late}) {
        timer->setEventHandler([held] { ++*held; });
        timer->setTimer(seconds(0), seconds(1), nanoseconds(0));
        timer->resume();
    }
    advance(seconds(10));
    endQueues();
    earlier->suspend();
    late->cancel();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(*held, 0);
    EXPECT_EQ(calls(), Times{});
}

TEST_F(TimerShutdownTest, WhatTheHandlersHeldMayStillQueueWorkAtTheShutdown) {
    struct Farewell {
        std::shared_ptr<WorkQueue> queue;
        bool& said;
        Farewell(std::shared_ptr<WorkQueue> lastQueue, bool& isSaid)
            : queue(std::move(lastQueue)), said(isSaid) {}
        Farewell(const Farewell&) = delete;
        Farewell& operator=(const Farewell&) = delete;
        ~Farewell() {
            queue->async([&said = said] { said = true; });
        }
    };
    bool said = false;
    const auto timer = makeTimer();
    auto farewell = std::make_shared<Farewell>(queues().serialQueueWithLabel("last"), said);
    timer->setEventHandler([farewell = std::move(farewell)] {});

    queues().finish();

    EXPECT_TRUE(said);
}

} // namespace
} // namespace nimbra::device
