#include "host/core/HostLoop.h"

#include "device/system/CurrentQueue.h"
#include "device/system/DeviceWorkQueues.h"

#include <atomic>
#include <future>
#include <gtest/gtest.h>
#include <memory>
#include <poll.h>
#include <string>
#include <thread>
#include <vector>

namespace nimbra::host {
namespace {

bool isReadable(int descriptor) {
    pollfd request{.fd = descriptor, .events = POLLIN, .revents = 0};
    return ::poll(&request, 1, 0) == 1;
}

/// Waits for the descriptor; whether it became readable.
bool becomesReadable(int descriptor) {
    constexpr int farTooLong = 60'000;
    pollfd request{.fd = descriptor, .events = POLLIN, .revents = 0};
    return ::poll(&request, 1, farTooLong) == 1;
}

TEST(HostLoop, RunsWorkInTheOrderInWhichItCame) {
    HostLoop loop;
    std::string order;
    loop.async([&] { order += 'a'; });
    loop.async([&] { order += 'b'; });

    EXPECT_TRUE(loop.runPending());

    EXPECT_EQ(order, "ab");
    EXPECT_FALSE(loop.runPending());
}

TEST(HostLoop, LeavesWorkThatIsQueuedMeanwhileForTheNextRun) {
    HostLoop loop;
    int runs = 0;
    loop.async([&] { loop.async([&] { ++runs; }); });

    loop.runPending();
    EXPECT_EQ(runs, 0);

    loop.runPending();
    EXPECT_EQ(runs, 1);
}

TEST(HostLoop, RunsWorkAsTheMainQueue) {
    HostLoop loop;
    std::string label;
    loop.async([&] { label = device::currentQueueLabel(); });

    loop.runPending();

    EXPECT_EQ(label, "main");
    EXPECT_EQ(loop.label(), "main");
    EXPECT_EQ(device::currentQueueLabel(), "other");
}

TEST(HostLoop, DestroysAPieceOfWorkBeforeTheNextOneStarts) {
    HostLoop loop;
    const auto held = std::make_shared<int>(0);
    long holders = 0;
    loop.async([held] {});
    loop.async([&, weak = std::weak_ptr(held)] { holders = weak.use_count(); });

    loop.runPending();

    EXPECT_EQ(holders, 1);
}

TEST(HostLoop, SaysThatWorkWaitsThroughItsDescriptor) {
    HostLoop loop;
    EXPECT_FALSE(isReadable(loop.wakeUpDescriptor()));

    loop.async([&] { loop.async([] {}); });
    EXPECT_TRUE(isReadable(loop.wakeUpDescriptor()));

    loop.runPending();
    EXPECT_TRUE(isReadable(loop.wakeUpDescriptor()));

    loop.runPending();
    EXPECT_FALSE(isReadable(loop.wakeUpDescriptor()));
}

TEST(HostLoop, RunsWhatIsLeftWhenItGoes) {
    bool hasRun = false;
    {
        HostLoop loop;
        loop.async([&] { loop.async([&] { hasRun = true; }); });
    }
    EXPECT_TRUE(hasRun);
}

TEST(HostLoop, SyncFromAnotherThreadReturnsWhenTheWorkHasRun) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    const auto queue = queues.serialQueueWithLabel("background");
    bool hasRun = false;
    bool wasRunBeforeReturn = false;
    queue->async([&] {
        loop.sync([&] { hasRun = true; });
        wasRunBeforeReturn = hasRun;
    });

    loop.runUntilIdle(queues);

    EXPECT_TRUE(wasRunBeforeReturn);
}

TEST(HostLoop, RunsUntilTheBackgroundHasNothingMoreToHandOver) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    const auto first = queues.serialQueueWithLabel("first");
    const auto second = queues.serialQueueWithLabel("second");
    constexpr int hops = 200;
    int done = 0;
    // Main to the background and back, over and over: the last hop ends on the main queue.
    std::function<void()> hop = [&] {
        ++done;
        if (done < hops) {
            (done % 2 == 0 ? first : second)->async([&] { loop.async([&] { hop(); }); });
        }
    };
    loop.async([&] { hop(); });

    loop.runUntilIdle(queues);

    EXPECT_EQ(done, hops);
    EXPECT_TRUE(queues.isIdle());
}

TEST(HostLoop, TakesWorkFromManyThreads) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    constexpr int threads = 8;
    constexpr int pieces = 250;
    std::vector<std::shared_ptr<WorkQueue>> background;
    int runs = 0;
    for (int index = 0; index < threads; ++index) {
        background.push_back(queues.serialQueueWithLabel("background"));
        background.back()->async([&] {
            for (int piece = 0; piece < pieces; ++piece) {
                loop.async([&] { ++runs; });
            }
        });
    }

    loop.runUntilIdle(queues);

    EXPECT_EQ(runs, threads * pieces);
}

TEST(HostLoop, IsIdleOnlyBeforeWorkComesAndAfterItHasEnded) {
    HostLoop loop;
    const device::DeviceWorkQueues queues(loop);
    bool wasIdleAtWork = true;
    bool wasIdleElsewhere = true;
    EXPECT_TRUE(loop.isIdle(queues));

    loop.async([&] {
        wasIdleAtWork = loop.isIdle(queues);
        std::thread([&] { wasIdleElsewhere = loop.isIdle(queues); }).join();
    });
    EXPECT_FALSE(loop.isIdle(queues));
    loop.runPending();

    EXPECT_FALSE(wasIdleAtWork);
    EXPECT_FALSE(wasIdleElsewhere);
    EXPECT_TRUE(loop.isIdle(queues));
}

TEST(HostLoop, IsNotIdleWhileTheBackgroundIsAtWork) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    loop.follow(queues);
    std::promise<void> end;
    queues.serialQueueWithLabel("background")->async([&end] { end.get_future().wait(); });

    EXPECT_FALSE(loop.runPending());
    EXPECT_FALSE(loop.isIdle(queues));
    EXPECT_FALSE(isReadable(loop.wakeUpDescriptor()));

    // Although it hands nothing over.
    end.set_value();
    EXPECT_TRUE(becomesReadable(loop.wakeUpDescriptor()));
    EXPECT_TRUE(loop.isIdle(queues));
}

TEST(HostLoop, WhoRunsItWhenItWakesUpSeesTheEndOfEverything) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    loop.follow(queues);
    const auto background = queues.serialQueueWithLabel("background");
    constexpr int hops = 200;
    int done = 0;
    std::function<void()> hop = [&] {
        ++done;
        // The last one ends in the background.
        background->async([&, goesOn = done < hops] {
            if (goesOn) {
                loop.async([&] { hop(); });
            }
        });
    };
    loop.async([&] { hop(); });

    while (!loop.isIdle(queues)) {
        ASSERT_TRUE(becomesReadable(loop.wakeUpDescriptor()));
        loop.runPending();
    }

    EXPECT_EQ(done, hops);
}

TEST(HostLoop, GoesOnFollowingTheQueuesThatItHasWaitedFor) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    loop.runUntilIdle(queues);

    queues.serialQueueWithLabel("background")->async([] {});

    EXPECT_TRUE(becomesReadable(loop.wakeUpDescriptor()));
}

TEST(HostLoop, IsNeverFoundIdleFromElsewhereWhileWorkGoesToAndFro) {
    HostLoop loop;
    device::DeviceWorkQueues queues(loop);
    loop.follow(queues);
    const auto background = queues.serialQueueWithLabel("background");
    constexpr int hops = 5000;
    std::atomic<int> done = 0;
    std::function<void()> hop = [&] {
        if (done < hops) {
            background->async([&] {
                loop.async([&] {
                    ++done;
                    hop();
                });
            });
        }
    };
    std::promise<void> started;
    hop();
    int doneWhenIdle = 0;
    std::thread watcher([&] {
        started.set_value();
        while (!loop.isIdle(queues)) {
        }
        doneWhenIdle = done;
    });
    started.get_future().wait();

    loop.runUntilIdle(queues);
    watcher.join();

    EXPECT_EQ(doneWhenIdle, hops);
}

TEST(HostLoopDeathTest, AMainQueueThatWaitsForItselfStopsTheProgram) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(
        {
            HostLoop loop;
            loop.sync([] {});
        },
        "the main queue waits for itself");
}

} // namespace
} // namespace nimbra::host
