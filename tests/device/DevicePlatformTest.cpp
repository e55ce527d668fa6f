#include "device/DevicePlatform.h"

#include "device/DeviceDirectory.h"
#include "device/documents/ProgressPublisher.h"
#include "device/store/ConsentBundle.h"
#include "device/store/DeviceAccountStore.h"
#include "device/store/DevicePrivacyConsentStore.h"
#include "device/system/DevicePreferences.h"
#include "device/system/DeviceSettings.h"
#include "device/system/DeviceWorkQueues.h"
#include "device/system/StandingTime.h"
#include "platform/accounts/AccountStore.h"
#include "platform/accounts/DeviceListRequests.h"
#include "platform/apps/Applications.h"
#include "platform/documents/DaemonConnection.h"
#include "platform/documents/DocumentContainers.h"
#include "platform/documents/ProgressReports.h"
#include "platform/system/Clock.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "platform/system/FileManager.h"
#include "platform/system/Localization.h"
#include "platform/system/SystemLog.h"
#include "tests/device/DevicePlatformFixture.h"
#include "tests/device/TestFiles.h"

#include <future>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

class DevicePlatformTest : public test::DevicePlatformFixture {
protected:
    DevicePlatformTest() {
        DeviceDescription description;
        description.locale = "fr";
        description.identity = "token";
        description.containers = {{.identifier = "c", .isPublic = true}};
        description.preferences["domain"] = {{"level", 4}};
        const auto created = createDeviceDirectory(root(), description);
        EXPECT_TRUE(created) << created.error();
    }

    [[nodiscard]] std::filesystem::path state(const std::string& name) const {
        return root() / "var/lib/nimbra" / name;
    }

    /// Expects that opening fails with `message` about `name` and leaves every byte as it was.
    void expectRefusal(const std::string& name, const std::string& message) {
        const auto before = test::treeOf(root());
        const auto platform = DevicePlatform::open(root(), mainQueue(), {});
        ASSERT_FALSE(platform);
        EXPECT_EQ(platform.error().description, state(name).string() + ": " + message);
        EXPECT_EQ(test::treeOf(root()), before);
    }
};

TEST_F(DevicePlatformTest, TheServicesAnswerFromTheDirectory) {
    const auto platform = openPlatform();

    const PlatformServices services = platform->servicesFor(host());

    EXPECT_EQ(services.presenter.operator->(), &presenter());
    EXPECT_EQ(services.viewMetrics.operator->(), &viewMetrics());
    EXPECT_EQ(services.viewAnimations.operator->(), &host().viewAnimations);
    EXPECT_TRUE(services.accountStore->accountWithIdentifier(AccountIdentifier("primary")));
    EXPECT_EQ(services.fileManager->tidewaterIdentityToken(), Text("token"));
    EXPECT_EQ(services.documentContainers->allContainers().size(), 1U);
    EXPECT_EQ(services.localization->currentLocale(), Locale{"fr"});
    EXPECT_EQ(&services.workQueues->mainQueue(), &mainQueue());
    EXPECT_EQ(platform->accountStore().accountIdentifiers(),
              std::vector{AccountIdentifier("primary")});
    EXPECT_EQ(services.preferences->appIntegerValueForKeyInDomain("level", "domain"), 4);
    EXPECT_EQ(platform->settings().localeIdentifier(), "fr");
    EXPECT_TRUE(platform->systemLog().isEnabled(LogLevel::error));
}

TEST_F(DevicePlatformTest, ApplicationsAndConsentAreThoseOfTheDescription) {
    const std::string odd = " \n😀 \\ دفتر ";
    DeviceDescription description;
    description.apps = {{.identifier = "com/a", .name = odd, .entitlements = {{"key", odd}}},
                        {.identifier = "com.b", .name = "B", .removedSystemApp = true}};
    description.consent = {{.service = kPRVServiceTidewater.string(), .bundle = "com/a"}};
    const auto place = root() / "other";
    ASSERT_TRUE(createDeviceDirectory(place, description));
    const auto platform = DevicePlatform::open(place, mainQueue(), {});
    ASSERT_TRUE(platform) << platform.error();

    const PlatformServices services = (*platform)->servicesFor(host());
    const auto first =
        services.applications->applicationProxyForIdentifier(BundleIdentifier("com/a"));
    const auto second =
        services.applications->applicationProxyForIdentifier(BundleIdentifier("com.b"));
    const auto records =
        services.privacyConsentStore->PRVAccessCopyInformation(kPRVServiceTidewater);

    ASSERT_TRUE(first && second);
    EXPECT_EQ(first->localizedName(), Text(odd));
    EXPECT_FALSE(first->isRemovedSystemApp());
    EXPECT_EQ(first->entitlements(), (Entitlements{{"key", {odd}}}));
    EXPECT_TRUE(second->isRemovedSystemApp());
    ASSERT_TRUE(records && records->size() == 1);
    EXPECT_EQ(records->front().kPRVInfoBundle->identifier(), BundleIdentifier("com/a"));
    EXPECT_EQ(records->front().kPRVInfoGranted, std::nullopt);
}

TEST_F(DevicePlatformTest, TheClockAndTheTimersRunByTheTimeThatIsGiven) {
    const Date start(std::chrono::hours(400'000));
    const auto time = std::make_shared<StandingTime>(start);
    const auto platform = DevicePlatform::open(root(), mainQueue(), {.timeSource = time});
    ASSERT_TRUE(platform) << platform.error();
    Date fired;
    const PlatformServices services = (*platform)->servicesFor(host());
    const auto timer = services.workQueues->timerSourceOnQueue(mainQueue());
    timer->setEventHandler([&] { fired = services.clock->now(); });
    timer->setTimer(std::chrono::seconds(60), std::chrono::seconds(60),
                    std::chrono::nanoseconds(0));
    timer->resume();
    EXPECT_EQ(services.clock->now(), start);

    time->advance(std::chrono::seconds(60));
    mainQueue().pump();

    EXPECT_EQ(fired, start + std::chrono::seconds(60));
}

TEST_F(DevicePlatformTest, WhatTimersAndDistributedNotificationsHoldGoesWithThePlatform) {
    const auto held = std::make_shared<int>(0);
    auto platform = openPlatform();
    const PlatformServices services = platform->servicesFor(host());
    auto timer = services.workQueues->timerSourceOnQueue(mainQueue());
    timer->setEventHandler([held, timer] { ++*held; });
    timer->setTimer(std::chrono::hours(1), std::chrono::hours(1), std::chrono::nanoseconds(0));
    timer->resume();
    timer.reset();
    static_cast<void>(services.distributedNotificationCenter->addObserverForName(
        MRDidUpdateLastSyncStatusDistributedNotification,
        {.queue = &mainQueue(), .usingBlock = [held](const Notification&) { ++*held; }}));
    services.distributedNotificationCenter->postNotification(
        {.name = MRDidUpdateLastSyncStatusDistributedNotification});
    mainQueue().pump();
    EXPECT_EQ(*held, 1);
    EXPECT_EQ(held.use_count(), 3);

    platform.reset();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_TRUE(std::filesystem::is_empty(root() / "run/nimbra/notifications"));
}

TEST_F(DevicePlatformTest, ProgressReachesSubscribersUntilThePlatformEnds) {
    std::vector<std::string> seen;
    const auto held = std::make_shared<int>();
    auto platform = openPlatform();
    const PlatformServices services = platform->servicesFor(host());
    const auto subscribe = [&] {
        return services.progressReports->_addSubscriberForFileURLWithPublishingHandler(
            services.daemonConnection->mobileDocumentsURL(),
            [&seen, held](const std::shared_ptr<ProgressReport>& progress) {
                seen.push_back(progress->localizedDescription().string());
                return [held] {};
            });
    };
    EXPECT_FALSE(std::filesystem::exists(root() / "run/nimbra/progress"));

    const auto subscriber = subscribe();
    const auto published = platform->progressPublisher().publish(
        "id", "file:///var/mobile/NimbraDrive/a", {.description = "one"});
    mainQueue().pump();

    EXPECT_TRUE(published);
    EXPECT_EQ(seen, std::vector<std::string>{"one"});
    EXPECT_TRUE(std::filesystem::exists(root() / "run/nimbra/progress"));
    platform.reset();
    mainQueue().pump();
    EXPECT_EQ(held.use_count(), 1);
}

TEST_F(DevicePlatformTest, TheDevicesOfAnAccountAreThoseOfItsFile) {
    test::writeTestFile(state("device-list.json"), R"({"needUpgrade": ["Pad"]})");
    const auto platform = openPlatform();
    const PlatformServices services = platform->servicesFor(host());
    std::promise<DeviceListResponse> answered;

    services.deviceListRequests
        ->initWithAccount(
            services.accountStore->accountWithIdentifier(AccountIdentifier("primary")))
        ->performRequestWithHandler([&answered](const auto&, const auto& response) {
            answered.set_value(response.value_or(DeviceListResponse()));
        });

    const DeviceListResponse response = answered.get_future().get();
    EXPECT_EQ(response.incompatibleDeviceNames, std::vector<Text>());
    EXPECT_EQ(response.needUpgradeDeviceNames, std::vector<Text>{"Pad"});
}

TEST_F(DevicePlatformTest, ADeviceWithABrokenListOfDevicesOpensAndAnswersWithNone) {
    test::writeTestFile(state("device-list.json"), "{");
    const auto platform = openPlatform();
    const PlatformServices services = platform->servicesFor(host());
    std::promise<bool> answered;

    services.deviceListRequests
        ->initWithAccount(
            services.accountStore->accountWithIdentifier(AccountIdentifier("primary")))
        ->performRequestWithHandler([&answered](const auto&, const auto& response) {
            answered.set_value(response.has_value());
        });

    EXPECT_FALSE(answered.get_future().get());
}

TEST_F(DevicePlatformTest, HandlersThatWaitForDevicesGoWhileTheServicesAreStillThere) {
    for (const char* const text : {R"({"outcome": "never answers"})", R"({"delay": 1000})"}) {
        test::writeTestFile(state("device-list.json"), text);
        auto platform = openPlatform();
        const PlatformServices services = platform->servicesFor(host());
        std::size_t found = 0;
        // Asks a service when it goes, as a screen may.
        std::shared_ptr<void> farewell(nullptr, [&found, services](const void*) {
            found = services.documentContainers->allContainers().size();
        });
        const auto account =
            services.accountStore->accountWithIdentifier(AccountIdentifier("primary"));
        services.deviceListRequests->initWithAccount(account)->performRequestWithHandler(
            [farewell = std::move(farewell)](const auto&, const auto&) { FAIL(); });

        platform.reset();

        EXPECT_EQ(found, 1U) << text;
        EXPECT_EQ(account.use_count(), 1) << text;
    }
}

TEST_F(DevicePlatformTest, ARefreshCompletesOnTheDevicesQueue) {
    const auto platform = openPlatform();
    std::promise<void> completed;

    platform->servicesFor(host()).documentContainers->forceRefreshAllContainersWithCompletion(
        [&completed] { completed.set_value(); });

    completed.get_future().wait();
}

TEST_F(DevicePlatformTest, TheEndWaitsForTheWorkThatUsesTheServices) {
    auto platform = openPlatform();
    const PlatformServices services = platform->servicesFor(host());
    const auto queue = services.workQueues->serialQueueWithLabel("late");
    std::promise<void> start;
    std::size_t found = 0;
    queue->async([&] {
        start.get_future().wait();
        found = services.documentContainers->allContainers().size();
    });
    start.set_value();

    platform.reset();

    EXPECT_EQ(found, 1U);
}

TEST_F(DevicePlatformTest, OpeningAndReadingLeavesTheDirectoryAsItWas) {
    const auto before = test::treeOf(root());

    EXPECT_TRUE(openPlatform()->accountStore().accountIdentifiers());

    EXPECT_EQ(test::treeOf(root()), before);
}

TEST_F(DevicePlatformTest, ADeviceOfAnEarlierVersionHasNoConsentUntilSomeIsGiven) {
    std::filesystem::remove(state("consent.db"));
    const auto platform = openPlatform();
    PrivacyConsentStore& store = platform->servicesFor(host()).privacyConsentStore;
    const ConsentBundle bundle{BundleIdentifier("a")};

    const auto before = store.PRVAccessCopyInformation(kPRVServiceTidewater);
    EXPECT_TRUE(store.PRVAccessSetForBundle(kPRVServiceTidewater, &bundle, true));
    const auto after = store.PRVAccessCopyInformation(kPRVServiceTidewater);

    ASSERT_TRUE(before);
    EXPECT_TRUE(before->empty());
    ASSERT_TRUE(after);
    EXPECT_EQ(after->size(), 1U);
    EXPECT_EQ(&store, &platform->privacyConsentStore());
    EXPECT_TRUE(std::filesystem::exists(state("consent.db")));
}

TEST_F(DevicePlatformTest, ADamagedConsentDatabaseIsReportedAndLeftAsItWas) {
    test::writeTestFile(state("consent.db"), std::string(4096, '?'));

    expectRefusal("consent.db", "not a consent database: file is not a database");
}

TEST_F(DevicePlatformTest, ADirectoryThatIsNoDeviceIsReported) {
    const auto missing = DevicePlatform::open(root() / "none", mainQueue(), {});

    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.error().description,
              (root() / "none").string() +
                  ": not a device directory: it has no folder var/lib/nimbra");
    EXPECT_FALSE(std::filesystem::exists(root() / "none"));
}

TEST_F(DevicePlatformTest, AStateThatCannotBeSeenIsReportedWithTheReason) {
    std::filesystem::create_symlink("round", root() / "round");

    const auto platform = DevicePlatform::open(root() / "round", mainQueue(), {});

    ASSERT_FALSE(platform);
    EXPECT_EQ(platform.error().description,
              (root() / "round/var/lib/nimbra").string() +
                  ": cannot be read: Too many levels of symbolic links");
}

TEST_F(DevicePlatformTest, EachMissingFileIsReported) {
    for (const char* const name : {"device.json", "restrictions.json", "documents.json"}) {
        const std::string content = test::contentOf(state(name));
        std::filesystem::remove(state(name));
        expectRefusal(name, "cannot be read: No such file or directory");
        test::writeTestFile(state(name), content);
    }
    std::filesystem::remove(state("accounts.db"));
    expectRefusal("accounts.db", "cannot be read: No such file or directory");
}

TEST_F(DevicePlatformTest, EachDamagedFileIsReportedWithItsPlaceAndLeftAsItWas) {
    const auto expectRefusalOf = [this](const std::string& name, const std::string& text,
                                        const std::string& message) {
        const std::string content = test::contentOf(state(name));
        test::writeTestFile(state(name), text);
        expectRefusal(name, message);
        test::writeTestFile(state(name), content);
    };
    expectRefusalOf("device.json", "{\n\"locale\": de}",
                    "line 2, column 11: not JSON: syntax error while parsing value - invalid "
                    "literal");
    expectRefusalOf("device.json", R"({"abilities": {"cellularData": 1}})",
                    "/abilities/cellularData: expected true or false, found 1");
    expectRefusalOf("restrictions.json", R"({"cloudSyncDenied": 1})",
                    "/cloudSyncDenied: expected an array, found 1");
    expectRefusalOf("documents.json", R"({"containers": [{}]})",
                    "/containers/0/identifier: expected a string that is not empty, found nothing");
    expectRefusalOf("preferences/domain.json", "7",
                    "/: expected an object of keys and values, found 7");
    expectRefusalOf("accounts.db", std::string(4096, '?'),
                    "not an account database: file is not a database");
}

} // namespace
} // namespace nimbra::device
