#include "tests/footer/FooterFixture.h"

#include <atomic>
#include <latch>
#include <thread>

namespace nimbra::test {
namespace {

constexpr int kRounds = 1000;

using FooterPropertiesRace = FooterFixture;

TEST_F(FooterPropertiesRace, ThreePropertiesMayBeReadWhileTheViewComesAndGoes) {
    std::atomic<bool> isOver = false;
    std::latch started(1);
    std::shared_ptr<ProgressSubscriber> subscriber;
    std::shared_ptr<ObserverToken> token;
    bool isSyncing = false;
    std::jthread reader([&] {
        started.count_down();
        while (!isOver) {
            subscriber = view->globalProgressSubscriber();
            token = view->lastSyncDateSubscriber();
            isSyncing = view->isSyncing();
        }
        // Once more, now that nothing changes.
        subscriber = view->globalProgressSubscriber();
        token = view->lastSyncDateSubscriber();
        isSyncing = view->isSyncing();
    });
    started.wait();

    for (int round = 0; round < kRounds; ++round) {
        view->moveToWindow(nullptr);
        view->moveToWindow(&window);
        platform.progressReports.publish(progressCalled("Uploading"))();
    }
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));
    isOver = true;
    reader.join();

    EXPECT_NE(subscriber, nullptr);
    EXPECT_EQ(subscriber, view->globalProgressSubscriber());
    EXPECT_EQ(token, platform.distributedNotificationCenter.registrations.back().token);
    EXPECT_TRUE(isSyncing);
    end();
}

} // namespace
} // namespace nimbra::test
