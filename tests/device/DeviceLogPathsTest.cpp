#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/files/DevicePaths.h"
#include "platform/accounts/AccountStore.h"
#include "platform/accounts/DeviceListRequests.h"
#include "platform/apps/AppTerminator.h"
#include "platform/apps/Applications.h"
#include "platform/documents/DaemonConnection.h"
#include "platform/documents/DocumentContainers.h"
#include "platform/documents/LastSync.h"
#include "platform/documents/ProgressReports.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/system/Bundles.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "platform/system/FileManager.h"
#include "platform/system/Preferences.h"
#include "platform/system/RestrictionsProfile.h"
#include "platform/system/WorkQueues.h"
#include "tests/device/DevicePlatformFixture.h"
#include "tests/device/TestFiles.h"

#include <algorithm>
#include <array>
#include <set>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::device {
namespace {

using std::filesystem::path;

constexpr const char* bundlePath = "/System/Library/A.bundle";

enum class Damage : std::uint8_t { otherContent, otherKind, linkToItself };
constexpr std::array damages{Damage::otherContent, Damage::otherKind, Damage::linkToItself};

/// Makes of what stands at `place`, if anything, something that nobody expects there.
void damage(const path& place, Damage how) {
    const bool isFolder = std::filesystem::is_directory(place);
    if (how == Damage::otherContent && !isFolder) {
        test::writeTestFile(place, "{ neither what it was\nnor anything like it");
        return;
    }
    std::filesystem::remove_all(place);
    std::filesystem::create_directories(place.parent_path());
    if (how == Damage::linkToItself) {
        std::filesystem::create_symlink(place.filename(), place);
    } else if (isFolder) {
        test::writeTestFile(place, "in the way");
    } else {
        std::filesystem::create_directory(place);
    }
}

/// A device that has something of everything, and what its log and its errors say of it when it is
/// damaged while it is used.
class DeviceLogPathsTest : public test::DevicePlatformFixture {
protected:
    DeviceLogPathsTest() {
        DeviceDescription description;
        description.identity = "token";
        description.containers = {{.identifier = "c", .isPublic = true}};
        description.preferences["domain"] = {{"level", 4}};
        description.apps = {{.identifier = "com.a", .name = "A"}};
        description.consent = {{.service = kPRVServiceTidewater.string(), .bundle = "com.a"}};
        EXPECT_TRUE(createDeviceDirectory(whole(), description));
        const path bundle = whole() / path(bundlePath).relative_path();
        test::writeTestFile(bundle / "manifest.json",
                            R"({"identifier": "a", "executable": "A.so"})");
        std::filesystem::copy_file(path(NIMBRA_TEST_OBJECTS) / "test-object-first.so",
                                   bundle / "A.so");
        test::writeTestFile(bundle / "en/Localizable.json", "{}");
        test::writeTestFile(bundle / "Logo.png", "no image");
        test::writeTestFile(whole() / "run/nimbra/com.a.pid", "0\n");
        test::writeTestFile(whole() / "run/nimbra/progress/a.json", "{}");
        test::writeTestFile(whole() / "run/nimbra/notifications/left.by.nobody", "");
    }

    [[nodiscard]] path whole() const { return root() / "whole"; }
    /// Where the copies stand that are damaged.
    [[nodiscard]] path copies() const { return root() / "copies"; }

    /// Everything on the device but what leads to its log.
    [[nodiscard]] std::vector<path> places() const {
        std::vector<path> places;
        for (const auto& [place, content] : test::treeOf(whole())) {
            if (!kLogFile.starts_with('/' + place)) {
                places.emplace_back(place);
            }
        }
        places.emplace_back(path("run/nimbra/priority-hints"));
        return places;
    }

    /// Lets a pane's services use everything of the device at `device`, of which `place` is damaged
    /// once the device is open, and gives what they say of it.
    std::vector<std::string> linesOf(const path& device, const path& place, Damage how) {
        auto platform = DevicePlatform::open(device, mainQueue(), {.keepsLogToItself = true});
        EXPECT_TRUE(platform) << platform.error();
        damage(device / place, how);
        std::vector<std::string> lines;
        useEverything(**platform, lines);
        platform->reset();
        mainQueue().pump();
        std::istringstream log(test::contentOf(device / path(kLogFile).relative_path()));
        for (std::string line; std::getline(log, line);) {
            lines.push_back(line.substr(line.find(": ")));
        }
        return lines;
    }

private:
    void useEverything(DevicePlatform& platform, std::vector<std::string>& errors) {
        const PlatformServices services = platform.servicesFor(host());
        const auto note = [&errors](const auto& outcome) {
            if (!outcome) {
                errors.push_back(": " + outcome.error().description);
            }
        };
        const BundleIdentifier application("com.a");
        if (const auto account =
                services.accountStore->accountWithIdentifier(AccountIdentifier("primary"))) {
            account->vt_setUsesStratafile(!account->vt_isUsingStratafile());
            services.accountStore->saveVerifiedAccountWithCompletionHandler(account, note);
            services.deviceListRequests->initWithAccount(account)->performRequestWithHandler(
                [](const auto&, const auto&) {});
        }
        for (const auto& container : services.documentContainers->allContainers()) {
            note(container->registerCurrentProcessAsPriorityHintWithError());
        }
        services.documentContainers->unregisterCurrentProcessAsPriorityHint();
        static_cast<void>(services.fileManager->tidewaterIdentityToken());
        note(services.lastSync->MRGetLastSyncDateWithError());
        note(services.lastSync->MRGetLocalizedLastSyncWithError());
        static_cast<void>(services.restrictions->isCloudSyncAllowed(application));
        static_cast<void>(services.preferences->appIntegerValueForKeyInDomain("level", "domain"));
        static_cast<void>(
            services.privacyConsentStore->PRVAccessCopyInformation(kPRVServiceTidewater));
        static_cast<void>(services.applications->applicationProxyForIdentifier(application));
        services.appTerminator->terminateApplication(application, {});
        if (const auto bundle = services.bundles->bundleWithPath(bundlePath)) {
            note(bundle->load());
        }
        static_cast<void>(services.distributedNotificationCenter->addObserverForName(
            NotificationName("name"),
            {.queue = &mainQueue(), .usingBlock = [](const Notification&) {}}));
        services.distributedNotificationCenter->postNotification(
            {.name = NotificationName("name")});
        const auto subscriber =
            services.progressReports->_addSubscriberForFileURLWithPublishingHandler(
                services.daemonConnection->mobileDocumentsURL(), [](const auto&) { return [] {}; });
        mainQueue().pump();
    }
};

TEST_F(DeviceLogPathsTest, WhateverIsDamagedIsCalledAsTheDeviceCallsIt) {
    std::set<std::string> said;
    std::size_t count = 0;
    for (const path& place : places()) {
        for (const Damage how : damages) {
            // One of its own each: what is loaded from it stays loaded under its path.
            const path device = copies() / std::to_string(++count);
            std::filesystem::create_directories(copies());
            std::filesystem::copy(whole(), device,
                                  std::filesystem::copy_options::recursive |
                                      std::filesystem::copy_options::copy_symlinks);

            for (const std::string& line : linesOf(device, place, how)) {
                EXPECT_EQ(line.find(root().string()), std::string::npos)
                    << place << ' ' << static_cast<int>(how) << ": " << line;
                said.insert(line);
            }
            std::filesystem::remove_all(device);
        }
    }

    // Each of these has been told of by its name in some line.
    for (const std::string_view name :
         {kAccountsDatabase, kConsentDatabase, kRestrictionsFile, kDocumentsFile, kDeviceListFile,
          kPreferencesDirectory, kApplicationsDirectory, kRunningApplicationsDirectory,
          kPriorityHintsDirectory, kProgressDirectory, kNotificationsDirectory,
          std::string_view("/run/nimbra/progress/a.json"),
          std::string_view("/run/nimbra/com.a.pid"),
          std::string_view("/System/Library/A.bundle/A.so"),
          std::string_view("/System/Library/A.bundle/Logo.png"),
          std::string_view("/System/Library/A.bundle/manifest.json")}) {
        EXPECT_TRUE(std::ranges::any_of(said, [name](const std::string& line) {
            return line.contains(' ' + std::string(name));
        })) << name;
    }
}

} // namespace
} // namespace nimbra::device
