#include "host/core/AccountPage.h"
#include "platform/host/SettingsListController.h"
#include "platform/system/ClassRegistry.h"
#include "tests/host/core/TracersFixture.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

TEST_F(Tracers, TellWhichAccountIsFetchedAndWhatIsChangedOnIt) {
    _platform.accountStore.stored.usesStratafile = false;
    const auto account =
        _services.accountStore->accountWithIdentifier(AccountIdentifier("primary"));
    ASSERT_TRUE(account);
    account->setEnabledForDataclass(true, kAccountDataclassTidewater);

    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(account->vt_isUsingStratafile());
    EXPECT_EQ(account->identifier(), AccountIdentifier("primary"));
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"fetchAccount","account":"primary"})",
                     R"({"event":"account","op":"setEnabled:forDataclass:","account":"primary",)"
                     R"("dataclass":"kAccountDataclassTidewater","value":true})"}));
}

TEST_F(Tracers, GiveNoAccountWhereThereIsNone) {
    EXPECT_FALSE(_services.accountStore->accountWithIdentifier(AccountIdentifier("nobody")));
    EXPECT_FALSE(_tracer.traced(nullptr));
}

TEST_F(Tracers, TellOfObserversAsLongAsTheyAreRegistered) {
    const NotificationName name("Changed");
    int calls = 0;
    const auto token = _services.notificationCenter->addObserverForName(
        name, {.usingBlock = [&](const Notification&) { ++calls; }});
    _services.notificationCenter->postNotification({.name = name});
    _services.notificationCenter->removeObserver(token);
    _services.notificationCenter->removeObserver(token);
    _services.notificationCenter->removeObserver(nullptr);
    _services.notificationCenter->postNotification({.name = name});

    EXPECT_EQ(calls, 1);
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"observer","op":"add","center":"local","name":"Changed"})",
                     R"({"event":"observer","op":"remove","center":"local","name":"Changed"})"}));
}

TEST_F(Tracers, TellOfObserversOnTheWholeDevice) {
    const NotificationName name("Changed");
    int calls = 0;
    const auto token = _services.distributedNotificationCenter->addObserverForName(
        name, {.queue = &_platform.workQueues.mainQueue(),
               .usingBlock = [&](const Notification&) { ++calls; }});
    _services.distributedNotificationCenter->postNotification({.name = name});
    _services.distributedNotificationCenter->removeObserver(token);
    _platform.workQueues.mainQueue().pump();

    EXPECT_EQ(calls, 1);
    EXPECT_EQ(_platform.distributedNotificationCenter.registrations.size(), 0U);
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"observer","op":"add","center":"distributed","name":"Changed"})",
                     R"({"event":"observer","op":"remove","center":"distributed",)"
                     R"("name":"Changed"})"}));
}

TEST_F(Tracers, TellWhatIsAskedOfATimerAndWhenItFallsDue) {
    int calls = 0;
    const auto timer = _services.workQueues->timerSourceOnQueue(_services.workQueues->mainQueue());
    timer->setEventHandler([&] { ++calls; });
    timer->setTimer(std::chrono::seconds(2), std::chrono::milliseconds(1500),
                    std::chrono::nanoseconds(0));
    timer->resume();
    _platform.workQueues.timers().at(0)->fire();
    timer->suspend();
    timer->cancel();

    EXPECT_EQ(calls, 1);
    EXPECT_EQ(_platform.workQueues.timers().at(0)->calls,
              (Lines{"arm 2.000000/1.500000", "resume", "suspend", "cancel"}));
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"timer","op":"arm","first":2,"interval":1.5})",
                     R"({"event":"timer","op":"resume"})", R"({"event":"timer","op":"fire"})",
                     R"({"event":"timer","op":"suspend"})", R"({"event":"timer","op":"cancel"})"}));
}

TEST_F(Tracers, TellWhoseProgressIsFollowed) {
    const auto subscriber =
        _services.progressReports->_addSubscriberForFileURLWithPublishingHandler(
            "file:///documents/", [](const auto&) { return [] {}; });
    EXPECT_EQ(_platform.progressReports.subscriptionCount(), 1U);
    _services.progressReports->_removeSubscriber(subscriber);

    EXPECT_EQ(_platform.progressReports.subscriptionCount(), 0U);
    EXPECT_EQ(takeLines(), (Lines{R"({"event":"progress",)"
                                  R"("op":"_addSubscriberForFileURL:withPublishingHandler:",)"
                                  R"("url":"file:///documents/"})",
                                  R"({"event":"progress","op":"_removeSubscriber:"})"}));
}

TEST_F(Tracers, TellWhatIsAskedOfTheContainers) {
    _platform.documentContainers.listed = {
        {.identifier = "one", .isPublic = false},
        {.identifier = "two", .isPublic = true, .registrationFails = true}};

    const auto containers = _services.documentContainers->allContainers();
    ASSERT_EQ(containers.size(), 2U);
    EXPECT_FALSE(containers[0]->isDocumentScopePublic());
    EXPECT_FALSE(containers[1]->registerCurrentProcessAsPriorityHintWithError().has_value());
    bool isRefreshed = false;
    _services.documentContainers->forceRefreshAllContainersWithCompletion(
        [&] { isRefreshed = true; });
    _platform.documentContainers.refreshes.at(0)();
    _services.documentContainers->unregisterCurrentProcessAsPriorityHint();

    EXPECT_TRUE(isRefreshed);
    EXPECT_EQ(_platform.documentContainers.calls, (Lines{"register two", "unregister"}));
    EXPECT_EQ(
        takeLines(),
        (Lines{R"({"event":"container","op":"registerCurrentProcessAsPriorityHintWithError:",)"
               R"("container":null})",
               R"({"event":"container","op":"forceRefreshAllContainersWithCompletion:"})",
               R"({"event":"container","op":"unregisterCurrentProcessAsPriorityHint"})"}));
}

TEST_F(Tracers, TellWhatIsAskedOfTheConsentStore) {
    const auto notes = std::make_shared<test::FakeBundle>(BundleIdentifier("com.example.notes"));
    const test::FakeBundle nameless(std::nullopt);
    _platform.privacyConsentStore.records[kPRVServiceBrackwater] = {
        {.kPRVInfoBundle = notes, .kPRVInfoGranted = true}};

    PrivacyConsentStore& store = _services.privacyConsentStore;
    const auto records = store.PRVAccessCopyInformation(kPRVServiceBrackwater);
    EXPECT_TRUE(store.PRVAccessSetForBundle(kPRVServiceTidewater, notes.get(), false));
    EXPECT_TRUE(store.PRVAccessSetForBundle(kPRVServiceTidewater, &nameless, true));
    _platform.privacyConsentStore.refuses = true;
    EXPECT_FALSE(store.PRVAccessSetForBundle(kPRVServiceTidewater, nullptr, true));

    ASSERT_TRUE(records);
    ASSERT_EQ(records->size(), 1U);
    EXPECT_EQ(records->front().kPRVInfoBundle, notes);
    EXPECT_EQ(_platform.calls,
              (Lines{"copy kPRVServiceBrackwater", "set kPRVServiceTidewater com.example.notes off",
                     "set kPRVServiceTidewater nobody on", "set kPRVServiceTidewater nobody on"}));
    const std::string set =
        R"({"event":"consent","op":"PRVAccessSetForBundle","service":"kPRVServiceTidewater",)";
    EXPECT_EQ(takeLines(), (Lines{R"({"event":"consent","op":"PRVAccessCopyInformation",)"
                                  R"("service":"kPRVServiceBrackwater"})",
                                  set + R"("bundle":"com.example.notes","granted":false})",
                                  set + R"("bundle":null,"granted":true})",
                                  set + R"("bundle":null,"granted":true})"}));
}

TEST_F(Tracers, LeaveAStoreThatCannotBeReadUnreadable) {
    _platform.privacyConsentStore.unreadable.insert(kPRVServiceTidewater);

    EXPECT_FALSE(_services.privacyConsentStore->PRVAccessCopyInformation(kPRVServiceTidewater));
}

TEST_F(Tracers, TellWhichApplicationsAreToBeEnded) {
    const BundleIdentifier notes("com.example.notes");
    _services.appTerminator->terminateApplication(notes, {.reason = 3});
    _services.appTerminator->terminateApplication(
        notes, {.reason = 4, .report = true, .description = "why"});

    EXPECT_EQ(_platform.calls, (Lines{"terminate com.example.notes for 3, not reported",
                                      "terminate com.example.notes for 4, reported, described"}));
    EXPECT_EQ(takeLines(), (Lines{R"({"event":"terminate","bundle":"com.example.notes","reason":3,)"
                                  R"("report":false,"description":null})",
                                  R"({"event":"terminate","bundle":"com.example.notes","reason":4,)"
                                  R"("report":true,"description":"why"})"}));
}

TEST_F(Tracers, TellOfConsentAndTerminationBeforeTheyHappen) {
    Trace trace([this](const std::string&) { _platform.calls.emplace_back("traced"); });
    TracingPrivacyConsentStore store(_platform.privacyConsentStore, trace);
    TracingAppTerminator terminator(_platform.appTerminator, trace);

    EXPECT_TRUE(store.PRVAccessCopyInformation(kPRVServiceTidewater));
    EXPECT_TRUE(store.PRVAccessSetForBundle(kPRVServiceTidewater, nullptr, true));
    terminator.terminateApplication(BundleIdentifier("notes"), {.reason = 3});

    EXPECT_EQ(_platform.calls, (Lines{"traced", "copy kPRVServiceTidewater", "traced",
                                      "set kPRVServiceTidewater nobody on", "traced",
                                      "terminate notes for 3, not reported"}));
}

TEST_F(Tracers, TellThatTheParentIsBuiltAnew) {
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto page = std::make_shared<AccountPage>(_services, "Drive", paneClass, UserInfo());
    _tracer.observeParent(*page);

    page->reloadSpecifiers();
    page->reloadSpecifierAnimated(page->entryRow(), true);

    EXPECT_EQ(takeLines(), Lines{R"({"event":"parent","op":"reloadSpecifiers"})"});
}

TEST_F(Tracers, TellOfEachChangeOfTheList) {
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto page = std::make_shared<AccountPage>(_services, "Drive", paneClass, UserInfo());
    static_cast<void>(page->specifiers());
    page->setObserver(&_tracer.listObserver());
    const auto more = Specifier::groupSpecifierWithID("More");
    const auto nameless = Specifier::preferenceSpecifierNamed(nullptr, {.cell = ButtonCell});

    page->beginUpdates();
    page->insertSpecifierAfterSpecifierAnimated(more, page->entryRow(), true);
    page->addSpecifiersFromArrayAnimated({nameless}, false);
    page->endUpdates();
    page->removeContiguousSpecifiersAnimated({more, nameless}, true);
    page->removeSpecifierAnimated(more, true);
    page->reloadSpecifierAnimated(page->entryRow(), true);
    page->reloadSpecifiers();

    EXPECT_EQ(
        takeLines(),
        (Lines{R"({"event":"table","op":"beginUpdates","rows":[],"animated":true})",
               R"({"event":"table","op":"insert","rows":["More"],"after":"Drive","animated":true})",
               R"({"event":"table","op":"append","rows":[null],"animated":false})",
               R"({"event":"table","op":"endUpdates","rows":[],"animated":true})",
               R"({"event":"table","op":"remove","rows":["More",null],"animated":true})",
               R"({"event":"table","op":"reloadRow","rows":["Drive"],"animated":true})",
               R"({"event":"table","op":"reload","rows":["Services","Drive"],"animated":false})"}));
}

TEST_F(Tracers, TellThatARefreshHasEnded) {
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto page = std::make_shared<AccountPage>(_services, "Drive", paneClass, UserInfo());
    _tracer.observeRefreshControl(*page);
    const auto control = std::make_shared<RefreshControl>();
    page->table()->setRefreshControl(control);
    _tracer.observeRefreshControl(*page);

    control->endRefreshing();

    EXPECT_EQ(takeLines(), Lines{R"({"event":"refreshControl","op":"endRefreshing"})"});
}

TEST_F(Tracers, TakeTheLinesForSyslogWhileTheyLive) {
    Lines lines;
    Trace trace([&](const std::string& line) { lines.push_back(line); });
    {
        const SessionTracer tracer(_platform.services(), trace);
        writeSyslog(3, "lost");
    }
    writeSyslog(4, "found");

    EXPECT_EQ(lines, Lines{R"({"event":"syslog","queue":"other","priority":3,"message":"lost"})"});
    EXPECT_EQ(takeLines(), Lines{R"({"event":"syslog","priority":4,"message":"found"})"});
    EXPECT_TRUE(_syslog.lines.empty());
}

} // namespace
} // namespace nimbra::host
