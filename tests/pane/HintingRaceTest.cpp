#include "device/system/DeviceWorkQueues.h"
#include "tests/pane/PaneFixture.h"

#include <algorithm>
#include <atomic>
#include <latch>
#include <memory>
#include <mutex>
#include <thread>
#include <utility>
#include <vector>

namespace nimbra::test {
namespace {

constexpr int kPostingThreads = 4;
constexpr int kVisits = 200;

/// Real queues, which a test can wait for.
class WatchedQueues final : public WorkQueues {
public:
    explicit WatchedQueues(WorkQueue& mainQueue) : _queues(mainQueue) {}

    [[nodiscard]] WorkQueue& mainQueue() override { return _queues.mainQueue(); }
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override {
        const std::scoped_lock lock(_mutex);
        _made.push_back(_queues.serialQueueWithLabel(label));
        return _made.back();
    }
    [[nodiscard]] WorkQueue& globalQueueWithQuality(QualityClass quality) override {
        return _queues.globalQueueWithQuality(quality);
    }
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override {
        return _queues.dataOrSourceOnQueue(std::move(queue));
    }
    [[nodiscard]] std::shared_ptr<TimerEventSource> timerSourceOnQueue(WorkQueue& queue) override {
        return _queues.timerSourceOnQueue(queue);
    }

    /// How many queues were made.
    [[nodiscard]] std::size_t queueCount() {
        const std::scoped_lock lock(_mutex);
        return _made.size();
    }

    /// Waits until what is queued by now has run.
    void finishWork() {
        for (const auto& queue : _made) {
            queue->sync([] {});
        }
    }

private:
    device::DeviceWorkQueues _queues;
    std::mutex _mutex;
    std::vector<std::shared_ptr<WorkQueue>> _made;
};

/// The pane over real queues and threads, with notifications coming from everywhere at once.
struct HintingRaceTest : PaneFixture {
    PumpedQueue mainQueue{"main"};

    [[nodiscard]] PlatformServices servicesOver(WorkQueues& queues) {
        PlatformServices services = platform.services();
        services.workQueues = queues;
        return services;
    }

    void postChange() {
        platform.notificationCenter.postNotification(
            {.name = MRContainerListDidChangeNotification});
    }
};

TEST_F(HintingRaceTest, PostingFromManyThreadsWhileThePaneComesAndGoesIsSafe) {
    platform.documentContainers.listed = {{.identifier = "container"}};
    std::atomic<bool> isOver = false;
    std::latch started(kPostingThreads);
    std::vector<std::jthread> posters;
    for (int i = 0; i < kPostingThreads; ++i) {
        posters.emplace_back([this, &isOver, &started] {
            started.count_down();
            while (!isOver) {
                postChange();
            }
        });
    }
    started.wait();

    for (int visit = 0; visit < kVisits; ++visit) {
        WatchedQueues queues(mainQueue);
        const auto visited = std::make_shared<PaneWithRows>(servicesOver(queues));
        visited->setSpecifier(entry);
        visited->viewDidAppear(true);
        visited->viewDidDisappear(true);
        EXPECT_EQ(queues.queueCount(), 1U) << "two requests made one each";
    }
    isOver = true;
    posters.clear();

    // Each visit's queue was drained before its queues ended: its unregistration has run.
    EXPECT_EQ(std::ranges::count(platform.documentContainers.calls, "unregister"), kVisits);
}

TEST_F(HintingRaceTest, ThreeQuickChangesLeadToOneToThreeRuns) {
    WatchedQueues queues(mainQueue);
    const auto visited = std::make_shared<PaneWithRows>(servicesOver(queues));
    visited->viewDidAppear(true);
    queues.finishWork();
    const int runsOfTheAppearance = platform.documentContainers.enumerations;
    EXPECT_EQ(runsOfTheAppearance, 1);

    postChange();
    postChange();
    postChange();
    queues.finishWork();

    const int runs = platform.documentContainers.enumerations - runsOfTheAppearance;
    EXPECT_GE(runs, 1);
    EXPECT_LE(runs, 3);
}

TEST_F(HintingRaceTest, ChangesDuringARunLeadToOneMore) {
    WatchedQueues queues(mainQueue);
    const auto visited = std::make_shared<PaneWithRows>(servicesOver(queues));
    std::latch runBegan(1);
    std::latch changesCame(1);
    platform.documentContainers.onEnumeration = [&] {
        if (platform.documentContainers.enumerations == 1) {
            runBegan.count_down();
            changesCame.wait();
        }
    };
    visited->viewDidAppear(true);
    runBegan.wait();

    postChange();
    postChange();
    postChange();
    changesCame.count_down();
    queues.finishWork();

    EXPECT_EQ(platform.documentContainers.enumerations, 2);
}

} // namespace
} // namespace nimbra::test
