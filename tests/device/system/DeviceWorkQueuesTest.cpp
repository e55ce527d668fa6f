#include "device/system/DeviceWorkQueues.h"

#include "device/system/CurrentQueue.h"
#include "tests/device/Threads.h"
#include "tests/support/PumpedQueue.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>
#include <future>
#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <thread>
#include <vector>

namespace nimbra::device {
namespace {

class DeviceWorkQueuesTest : public testing::Test {
protected:
    [[nodiscard]] DeviceWorkQueues& queues() { return *_queues; }
    [[nodiscard]] test::PumpedQueue& mainQueue() { return _mainQueue; }
    void endQueues() { _queues.reset(); }

private:
    test::PumpedQueue _mainQueue{"main"};
    std::optional<DeviceWorkQueues> _queues{std::in_place, _mainQueue};
};

/// Counts how many of it are alive.
struct Counted {
    explicit Counted(std::atomic<int>& aliveCount) : alive(aliveCount) { ++alive; }
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;
    ~Counted() { --alive; }
    std::atomic<int>& alive;
};

TEST_F(DeviceWorkQueuesTest, TheMainQueueIsTheHosts) {
    EXPECT_EQ(&queues().mainQueue(), &mainQueue());
}

TEST_F(DeviceWorkQueuesTest, AQualityClassHasThePlatformsNumber) {
    EXPECT_EQ(static_cast<int>(UserInitiatedQuality), 25);
}

TEST_F(DeviceWorkQueuesTest, WorkRunsInOrderOnAThreadThatBearsTheQueuesLabel) {
    const auto queue = queues().serialQueueWithLabel("a-queue");
    std::vector<int> order;
    std::vector<std::string> labels;
    for (int index = 0; index < 100; ++index) {
        queue->async([&order, &labels, index] {
            order.push_back(index);
            labels.push_back(currentQueueLabel());
        });
    }
    queue->sync([] {});

    ASSERT_EQ(order.size(), 100U);
    EXPECT_TRUE(std::ranges::is_sorted(order));
    EXPECT_EQ(labels.front(), "a-queue");
    EXPECT_EQ(queue->label(), "a-queue");
}

TEST_F(DeviceWorkQueuesTest, SyncReturnsWhenTheWorkAndItsCapturesAreGone) {
    const auto queue = queues().serialQueueWithLabel("a-queue");
    std::atomic<int> alive = 0;
    bool ran = false;

    queue->sync([held = std::make_unique<Counted>(alive), &ran] { ran = held != nullptr; });

    EXPECT_TRUE(ran);
    EXPECT_EQ(alive, 0);
}

TEST_F(DeviceWorkQueuesTest, CapturesAreDestroyedOnTheQueueBeforeTheNextWorkStarts) {
    const auto queue = queues().serialQueueWithLabel("a-queue");
    std::promise<void> start;
    std::atomic<int> alive = 0;
    std::vector<int> seen;
    queue->async([&start] { start.get_future().wait(); });
    for (int index = 0; index < 3; ++index) {
        queue->async(
            [held = std::make_unique<Counted>(alive), &alive, &seen] { seen.push_back(alive); });
    }

    start.set_value();
    queue->sync([] {});

    EXPECT_EQ(seen, (std::vector{3, 2, 1}));
    EXPECT_EQ(alive, 0);
}

TEST_F(DeviceWorkQueuesTest, AQueueThatWaitsForAnotherKeepsNoneFromRunning) {
    std::vector<std::shared_ptr<WorkQueue>> chain(20);
    for (auto& queue : chain) {
        queue = queues().serialQueueWithLabel("link");
    }
    bool reachedTheEnd = false;
    const std::function<void(std::size_t)> descend = [&](std::size_t index) {
        if (index == chain.size()) {
            reachedTheEnd = true;
        } else {
            chain[index]->sync([&descend, index] { descend(index + 1); });
        }
    };

    descend(0);

    EXPECT_TRUE(reachedTheEnd);
}

TEST_F(DeviceWorkQueuesTest, WorkQueuedWhenTheLastOwnerLetsTheQueueGoStillRuns) {
    std::promise<void> start;
    std::promise<std::string> result;
    auto queue = queues().serialQueueWithLabel("a-queue");
    queue->async([&start] { start.get_future().wait(); });
    queue->async([&result] { result.set_value(currentQueueLabel()); });

    queue.reset();
    start.set_value();

    EXPECT_EQ(result.get_future().get(), "a-queue");
}

TEST_F(DeviceWorkQueuesTest, AQueueMayBeLetGoByItsOwnWork) {
    std::promise<void> done;
    auto queue = queues().serialQueueWithLabel("a-queue");
    WorkQueue& borrowed = *queue;
    borrowed.async([held = std::move(queue), &done]() mutable {
        held.reset();
        done.set_value();
    });

    endQueues();

    EXPECT_EQ(done.get_future().wait_for(std::chrono::seconds(0)), std::future_status::ready);
}

TEST_F(DeviceWorkQueuesTest, TheEndWaitsForAllWorkAndForTheWorkThatItQueues) {
    const auto first = queues().serialQueueWithLabel("first");
    const auto second = queues().serialQueueWithLabel("second");
    std::atomic<int> ran = 0;
    for (int index = 0; index < 50; ++index) {
        first->async([&second, &first, &ran] {
            second->async([&first, &ran] { first->async([&ran] { ++ran; }); });
        });
    }

    endQueues();

    EXPECT_EQ(ran, 50);
}

TEST_F(DeviceWorkQueuesTest, WorkForAQueueWhoseThreadsHaveEndedIsDropped) {
    const auto queue = queues().serialQueueWithLabel("a-queue");
    std::atomic<int> alive = 0;
    bool ran = false;
    endQueues();

    queue->async([held = std::make_unique<Counted>(alive), &ran] { ran = true; });
    queue->sync([held = std::make_unique<Counted>(alive), &ran] { ran = true; });

    EXPECT_FALSE(ran);
    EXPECT_EQ(alive, 0);
}

TEST_F(DeviceWorkQueuesTest, AnIdleDeviceHasNothingQueuedOrUnderWay) {
    EXPECT_TRUE(queues().isIdle());
    std::promise<void> start;
    std::promise<void> idle;
    queues().setIdleObserver([&idle] { idle.set_value(); });
    const auto queue = queues().serialQueueWithLabel("a-queue");

    queue->async([&start] { start.get_future().wait(); });
    EXPECT_FALSE(queues().isIdle());
    start.set_value();
    idle.get_future().wait();

    EXPECT_TRUE(queues().isIdle());
    queues().setIdleObserver({});
}

TEST_F(DeviceWorkQueuesTest, TheIdleObserverIsToldWhenTheCapturesAreGoneAndMayUseTheQueues) {
    std::atomic<int> alive = 0;
    std::promise<std::pair<int, std::string>> seen;
    const auto queue = queues().serialQueueWithLabel("a-queue");
    bool isFirst = true;
    queues().setIdleObserver([&] {
        if (isFirst) {
            isFirst = false;
            EXPECT_TRUE(queues().isIdle());
            queue->async([] {});
            seen.set_value({alive, currentQueueLabel()});
        }
    });

    queue->async([held = std::make_unique<Counted>(alive)] {});

    EXPECT_EQ(seen.get_future().get(), std::pair(0, std::string("a-queue")));
    endQueues();
}

TEST_F(DeviceWorkQueuesTest, AnObserverThatWasTakenBackIsNotTold) {
    int calls = 0;
    queues().setIdleObserver([&calls] { ++calls; });
    queues().setIdleObserver({});

    queues().serialQueueWithLabel("a-queue")->sync([] {});
    endQueues();

    EXPECT_EQ(calls, 0);
}

TEST_F(DeviceWorkQueuesTest, ManyQueuesComeAndGo) {
    std::atomic<int> ran = 0;
    for (int index = 0; index < 200; ++index) {
        queues().serialQueueWithLabel("short")->async([&ran] { ++ran; });
    }
    endQueues();
    EXPECT_EQ(ran, 200);
}

TEST_F(DeviceWorkQueuesTest, ThereIsOneGlobalQueueForWorkThatTheUserHasAskedFor) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::string label;

    queue.sync([&label] { label = currentQueueLabel(); });

    EXPECT_EQ(&queues().globalQueueWithQuality(UserInitiatedQuality), &queue);
    EXPECT_EQ(queue.label(), "user-initiated");
    EXPECT_EQ(label, "user-initiated");
}

TEST_F(DeviceWorkQueuesTest, WorkOfTheGlobalQueueThatWaitsKeepsNoOtherFromRunning) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    constexpr std::size_t count = 20;
    std::vector<std::promise<void>> started(count);
    // Each piece of work waits for the one that was queued after it.
    for (std::size_t index = 0; index < count; ++index) {
        queue.async([&started, index] {
            if (index + 1 < started.size()) {
                started[index + 1].get_future().wait();
            }
            started[index].set_value();
        });
    }

    started.front().get_future().wait();

    endQueues();
}

TEST_F(DeviceWorkQueuesTest, TheGlobalQueueMayWaitForItself) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::vector<int> order;

    queue.sync([&queue, &order] {
        queue.sync([&queue, &order] {
            queue.sync([&order] { order.push_back(3); });
            order.push_back(2);
        });
        order.push_back(1);
    });

    EXPECT_EQ(order, (std::vector{3, 2, 1}));
}

TEST_F(DeviceWorkQueuesTest, AThreadOfTheGlobalQueueRunsFurtherWorkWhenItHasNothingToDo) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::set<std::thread::id> threads;
    constexpr std::size_t count = 1000;

    for (std::size_t index = 0; index < count; ++index) {
        queue.sync([&threads] { threads.insert(std::this_thread::get_id()); });
    }

    EXPECT_LT(threads.size(), count);
}

TEST_F(DeviceWorkQueuesTest, WorkOfTheGlobalQueueCountsAsWorkUntilItsCapturesAreGone) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::atomic<int> alive = 0;
    std::promise<void> start;
    std::promise<std::pair<int, std::string>> idle;
    queues().setIdleObserver([&] { idle.set_value({alive, currentQueueLabel()}); });

    queue.async([&start, held = std::make_unique<Counted>(alive)] { start.get_future().wait(); });
    EXPECT_FALSE(queues().isIdle());
    start.set_value();

    EXPECT_EQ(idle.get_future().get(), std::pair(0, std::string("user-initiated")));
    EXPECT_TRUE(queues().isIdle());
    queues().setIdleObserver({});
}

TEST_F(DeviceWorkQueuesTest, TheIdleObserverMayWaitForTheGlobalQueueThatCallsIt) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::promise<void> done;
    std::atomic<bool> isFirst = true;
    queues().setIdleObserver([&] {
        if (isFirst.exchange(false)) {
            queue.sync([] {});
            done.set_value();
        }
    });

    queue.async([] {});

    done.get_future().wait();
    endQueues();
}

TEST_F(DeviceWorkQueuesTest, TheEndWaitsForTheGlobalQueueAndForTheWorkThatItQueues) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    const auto serial = queues().serialQueueWithLabel("serial");
    std::atomic<int> ran = 0;
    for (int index = 0; index < 50; ++index) {
        queue.async([&queue, &serial, &ran] {
            serial->async([&queue, &ran] { queue.async([&ran] { ++ran; }); });
        });
    }

    endQueues();

    EXPECT_EQ(ran, 50);
}

TEST_F(DeviceWorkQueuesTest, WorkForTheGlobalQueueWhoseThreadsHaveEndedIsDropped) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::atomic<int> alive = 0;
    bool ran = false;
    queues().finish();

    queue.async([held = std::make_unique<Counted>(alive), &ran] { ran = true; });
    queue.sync([held = std::make_unique<Counted>(alive), &ran] { ran = true; });

    EXPECT_FALSE(ran);
    EXPECT_EQ(alive, 0);
}

TEST_F(DeviceWorkQueuesTest, ManyThreadsMayQueueAtOnceToTheGlobalQueue) {
    WorkQueue& queue = queues().globalQueueWithQuality(UserInitiatedQuality);
    std::atomic<int> sum = 0;
    const auto count = [&queue, &sum] {
        for (int round = 0; round < 100; ++round) {
            queue.async([&sum] { ++sum; });
            queue.sync([&sum] { ++sum; });
        }
    };

    test::runAtOnce({count, count, count, count});
    endQueues();

    EXPECT_EQ(sum, 800);
}

TEST_F(DeviceWorkQueuesTest, ManyThreadsMayQueueAtOnce) {
    const auto queue = queues().serialQueueWithLabel("a-queue");
    int sum = 0; // the queue's own: no two pieces of work run at once
    const auto count = [&queue, &sum] {
        for (int round = 0; round < 100; ++round) {
            queue->async([&sum] { ++sum; });
            queue->sync([&sum] { ++sum; });
        }
    };

    test::runAtOnce({count, count, count, count});

    queue->sync([&sum] { EXPECT_EQ(sum, 800); });
}

TEST(DeviceWorkQueuesDeathTest, AQueueThatWaitsForItselfStopsTheProgram) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_DEATH(
        {
            test::PumpedQueue mainQueue("main");
            DeviceWorkQueues queues(mainQueue);
            const auto queue = queues.serialQueueWithLabel("a-queue");
            queue->sync([&queue] { queue->sync([] {}); });
        },
        "the queue \"a-queue\" waits for itself");
}

} // namespace
} // namespace nimbra::device
