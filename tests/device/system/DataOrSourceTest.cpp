#include "device/system/DataOrSource.h"

#include "device/system/DeviceWorkQueues.h"
#include "tests/device/Threads.h"
#include "tests/support/PumpedQueue.h"

#include <atomic>
#include <gtest/gtest.h>
#include <memory>

namespace nimbra::device {
namespace {

class DataOrSourceTest : public testing::Test {
protected:
    DataOrSourceTest() {
        _source->setEventHandler([this] { ++_calls; });
    }

    [[nodiscard]] int calls() const { return _calls; }
    [[nodiscard]] test::PumpedQueue& queue() { return *_queue; }
    [[nodiscard]] DataOrSource& source() { return *_source; }
    void letSourceGo() { _source.reset(); }

private:
    int _calls = 0;
    std::shared_ptr<test::PumpedQueue> _queue = std::make_shared<test::PumpedQueue>("test");
    std::unique_ptr<DataOrSource> _source = std::make_unique<DataOrSource>(_queue);
};

TEST_F(DataOrSourceTest, DataMergedBeforeTheHandlerStartsLeadsToOneCall) {
    source().resume();

    source().mergeData(1);
    source().mergeData(2);
    source().mergeData(1);
    EXPECT_EQ(calls(), 0);
    queue().pump();

    EXPECT_EQ(calls(), 1);
}

TEST_F(DataOrSourceTest, DataMergedAfterTheHandlerStartedLeadsToAnotherCall) {
    source().resume();
    bool merged = false;
    int calls = 0;
    source().setEventHandler([this, &merged, &calls] {
        ++calls;
        if (!merged) {
            merged = true;
            source().mergeData(1);
            source().mergeData(1);
        }
    });

    source().mergeData(1);
    queue().pump();

    EXPECT_EQ(calls, 2);
}

TEST_F(DataOrSourceTest, DataMergedWhileSuspendedWaitsForResume) {
    source().mergeData(1);
    source().mergeData(1);
    queue().pump();
    EXPECT_EQ(calls(), 0);

    source().resume();
    source().resume();
    queue().pump();

    EXPECT_EQ(calls(), 1);
}

TEST_F(DataOrSourceTest, ZeroAsksForNothing) {
    source().resume();

    source().mergeData(0);

    EXPECT_EQ(queue().pendingCount(), 0U);
}

TEST_F(DataOrSourceTest, ResumingWithoutDataAsksForNothing) {
    source().resume();

    EXPECT_EQ(queue().pendingCount(), 0U);
}

TEST_F(DataOrSourceTest, ACallThatHasNotStartedIsDroppedWithTheSource) {
    source().resume();
    source().mergeData(1);

    letSourceGo();
    queue().pump();

    EXPECT_EQ(calls(), 0);
}

TEST_F(DataOrSourceTest, AHandlerThatLetsItsSourceGoRunsToItsEnd) {
    source().resume();
    const auto captured = std::make_shared<int>(3);
    int seen = 0;
    source().setEventHandler([this, captured, &seen] {
        letSourceGo();
        seen = *captured;
    });
    source().mergeData(1);

    queue().pump();

    EXPECT_EQ(seen, 3);
    EXPECT_EQ(captured.use_count(), 1);
}

TEST(DataOrSourceThreadTest, RequestsFromManyThreadsAreNeverLostAndNeverMultiplied) {
    constexpr int threadCount = 4;
    constexpr int requests = 200;
    test::PumpedQueue mainQueue("main");
    std::atomic<int> asked = 0;
    std::atomic<int> seen = 0;
    std::atomic<int> calls = 0;
    {
        DeviceWorkQueues queues(mainQueue);
        const auto source = queues.dataOrSourceOnQueue(queues.serialQueueWithLabel("coalescing"));
        source->setEventHandler([&] {
            ++calls;
            seen = asked.load();
        });
        source->resume();
        const auto ask = [&] {
            for (int request = 0; request < requests; ++request) {
                ++asked;
                source->mergeData(1);
            }
        };
        test::runAtOnce({ask, ask, ask, ask});
        queues.finish();
    }
    EXPECT_EQ(seen, threadCount * requests);
    EXPECT_GE(calls, 1);
    EXPECT_LE(calls, threadCount * requests);
}

} // namespace
} // namespace nimbra::device
