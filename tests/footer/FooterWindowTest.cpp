#include "tests/footer/FooterFixture.h"

namespace nimbra::test {
namespace {

using namespace std::chrono_literals;
using FooterWindow = FooterFixture;

TEST_F(FooterWindow, EnteringAWindowReadsTheDateThenObservesThenSubscribes) {
    storeAge(61s);

    view->moveToWindow(&window);

    EXPECT_EQ(takeCalls(), (Calls{"sentence", "subscribe file:///documents/"}));
    ASSERT_EQ(platform.distributedNotificationCenter.registrations.size(), 1U);
    const auto& registration = platform.distributedNotificationCenter.registrations.front();
    EXPECT_EQ(registration.name, MRDidUpdateLastSyncStatusDistributedNotification);
    EXPECT_EQ(registration.name.string(), "MRDidUpdateLastSyncStatusDistributedNotification");
    EXPECT_EQ(registration.observation.object, nullptr);
    EXPECT_EQ(registration.observation.queue, &platform.workQueues.mainQueue());
    EXPECT_EQ(view->lastSyncDateSubscriber(), registration.token);
    EXPECT_NE(view->globalProgressSubscriber(), nullptr);
    EXPECT_EQ(text(), Text("Synced."));
}

TEST_F(FooterWindow, EnteringAWindowHasEachStepBehindTheOther) {
    storeAge(61s);
    std::vector<std::size_t> registrations;
    const auto note = [&] {
        registrations.push_back(platform.distributedNotificationCenter.registrations.size());
    };
    platform.lastSync.whenAsked = note;
    platform.progressReports.whenCalled = note;

    view->moveToWindow(&window);

    EXPECT_EQ(registrations, (std::vector<std::size_t>{0, 1}));
}

TEST_F(FooterWindow, LeavingTheWindowForgetsTheSubscriptionBetweenItsEndAndTheSentence) {
    view->moveToWindow(&window);
    std::vector<bool> subscribed;
    const auto note = [&] { subscribed.push_back(view->globalProgressSubscriber() != nullptr); };
    platform.progressReports.whenCalled = note;
    platform.lastSync.whenAsked = note;

    view->moveToWindow(nullptr);

    EXPECT_EQ(subscribed, (std::vector<bool>{true, false}));
}

TEST_F(FooterWindow, WithoutADateTheTextStaysAndNothingIsArmed) {
    view->moveToWindow(&window);

    EXPECT_EQ(text(), Text("    "));
    EXPECT_EQ(timer().calls, Calls());
    EXPECT_EQ(takeCalls(), Calls{"subscribe file:///documents/"});
    EXPECT_EQ(platform.systemLog.lines, FakeSystemLog::Lines());
}

TEST_F(FooterWindow, ADateThatCannotBeReadIsLoggedAndTheRestGoesOn) {
    platform.lastSync.date =
        std::unexpected(Error{.domain = "daemon", .code = 3, .description = "no answer"});

    view->moveToWindow(&window);

    const FakeSystemLog::Lines expected{
        {LogLevel::error, "Can't retrieve last sync date; no answer (daemon 3)"}};
    EXPECT_EQ(platform.systemLog.lines, expected);
    EXPECT_EQ(timer().calls, Calls());
    EXPECT_EQ(text(), Text("    "));
    EXPECT_EQ(platform.distributedNotificationCenter.registrations.size(), 1U);
    EXPECT_EQ(platform.progressReports.subscriptionCount(), 1U);
}

TEST_F(FooterWindow, LeavingTheWindowEndsTheSubscriptionAndRefreshesTheSentence) {
    storeAge(61s);
    view->moveToWindow(&window);
    static_cast<void>(takeCalls());
    timer().calls.clear();
    platform.lastSync.sentence = Text("Synced later.");

    view->moveToWindow(nullptr);

    EXPECT_EQ(takeCalls(), (Calls{"unsubscribe", "sentence"}));
    EXPECT_EQ(view->globalProgressSubscriber(), nullptr);
    EXPECT_EQ(text(), Text("Synced later."));
    EXPECT_EQ(timer().calls, Calls()) << "the timer goes on";
    EXPECT_TRUE(isAutoUpdating());
    EXPECT_EQ(platform.distributedNotificationCenter.registrations.size(), 1U);
    EXPECT_NE(view->lastSyncDateSubscriber(), nullptr);
}

TEST_F(FooterWindow, LeavingNoWindowDoesNothing) {
    view->moveToWindow(nullptr);

    EXPECT_EQ(takeCalls(), Calls());
    EXPECT_EQ(platform.distributedNotificationCenter.registrations.size(), 0U);
}

TEST_F(FooterWindow, MovingStraightIntoAnotherWindowSubscribesAnew) {
    view->moveToWindow(&window);
    const auto first = view->globalProgressSubscriber();
    static_cast<void>(takeCalls());
    Window other;

    view->moveToWindow(&other);

    EXPECT_EQ(takeCalls(), (Calls{"unsubscribe", "sentence", "subscribe file:///documents/"}));
    EXPECT_NE(view->globalProgressSubscriber(), first);
    EXPECT_EQ(platform.progressReports.subscriptionCount(), 1U);
    view->moveToWindow(nullptr);
}

TEST_F(FooterWindow, TwoEntriesLeaveTwoRegistrationsThatBothAct) {
    view->moveToWindow(&window);
    const auto first = view->lastSyncDateSubscriber();
    view->moveToWindow(nullptr);
    view->moveToWindow(&window);
    ASSERT_EQ(platform.distributedNotificationCenter.registrations.size(), 2U);
    EXPECT_EQ(platform.distributedNotificationCenter.registrations[0].token, first);
    EXPECT_EQ(platform.distributedNotificationCenter.registrations[1].token,
              view->lastSyncDateSubscriber());
    EXPECT_EQ(platform.distributedNotificationCenter.removals, 0);
    static_cast<void>(takeCalls());

    postLastSync({{MRSyncStatusLastSyncDateKey, now - 61s}});

    EXPECT_EQ(takeCalls(), (Calls{"sentence", "sentence"}));
    EXPECT_EQ(timer().calls, (Calls{"arm 1.000000/60.000000", "resume", "arm 1.000000/60.000000"}));
}

TEST_F(FooterWindow, NewsOfTheLastSyncReachAViewThatHasLeftItsWindow) {
    view->moveToWindow(&window);
    view->moveToWindow(nullptr);
    platform.lastSync.sentence = Text("Synced later.");

    postLastSync({{MRSyncStatusLastSyncDateKey, now}});

    EXPECT_EQ(text(), Text("Synced later."));
    EXPECT_TRUE(isAutoUpdating());
}

TEST_F(FooterWindow, NewsWithoutADateRefreshTheSentenceAndArmNothing) {
    view->moveToWindow(&window);
    static_cast<void>(takeCalls());

    postLastSync({});

    EXPECT_EQ(takeCalls(), Calls{"sentence"});
    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_EQ(timer().calls, Calls());
}

TEST_F(FooterWindow, SomethingElseUnderTheKeyOfTheDateIsNoDate) {
    view->moveToWindow(&window);

    postLastSync({{MRSyncStatusLastSyncDateKey, Text("yesterday")}});

    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_EQ(timer().calls, Calls());
}

TEST_F(FooterWindow, NewsAreIgnoredWhileSyncing) {
    view->moveToWindow(&window);
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));
    static_cast<void>(takeCalls());

    postLastSync({{MRSyncStatusLastSyncDateKey, now}});

    EXPECT_EQ(takeCalls(), Calls());
    EXPECT_EQ(text(), Text("Uploading"));
    EXPECT_EQ(timer().calls, Calls());
    end();
}

TEST_F(FooterWindow, LeavingTheWindowWhileSyncingLeavesTheBar) {
    view->moveToWindow(&window);
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));

    view->moveToWindow(nullptr);

    EXPECT_TRUE(view->isSyncing());
    EXPECT_FALSE(isBarHidden());
    EXPECT_EQ(text(), Text("Synced."));
    end();
    EXPECT_FALSE(view->isSyncing());
}

TEST_F(FooterWindow, TheRegistrationHoldsTheView) {
    view->moveToWindow(&window);
    timer().setEventHandler({});
    platform.progressReports.finish();
    const std::weak_ptr<View> held = view;

    view.reset();
    EXPECT_FALSE(held.expired());
    platform.distributedNotificationCenter.registrations.clear();

    EXPECT_TRUE(held.expired());
}

TEST_F(FooterWindow, TheSubscriptionHoldsTheView) {
    view->moveToWindow(&window);
    timer().setEventHandler({});
    platform.distributedNotificationCenter.registrations.clear();
    const std::weak_ptr<View> held = view;

    view.reset();
    EXPECT_FALSE(held.expired());
    platform.progressReports.finish();

    EXPECT_TRUE(held.expired());
}

} // namespace
} // namespace nimbra::test
