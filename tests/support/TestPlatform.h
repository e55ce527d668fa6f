#pragma once

#include "device/system/DeviceNotificationCenter.h"
#include "platform/PlatformServices.h"
#include "platform/system/ClassRegistry.h"
#include "platform/views/ViewAnimations.h"
#include "tests/support/FakeAccountStore.h"
#include "tests/support/FakeAppTerminator.h"
#include "tests/support/FakeApplications.h"
#include "tests/support/FakeBundles.h"
#include "tests/support/FakeClock.h"
#include "tests/support/FakeDaemonConnection.h"
#include "tests/support/FakeDeviceInfo.h"
#include "tests/support/FakeDeviceListRequests.h"
#include "tests/support/FakeDistributedNotificationCenter.h"
#include "tests/support/FakeDocumentContainers.h"
#include "tests/support/FakeFileManager.h"
#include "tests/support/FakeLastSync.h"
#include "tests/support/FakeLocalization.h"
#include "tests/support/FakePreferences.h"
#include "tests/support/FakePrivacyConsentStore.h"
#include "tests/support/FakeProcesses.h"
#include "tests/support/FakeProgressReports.h"
#include "tests/support/FakeRestrictionsProfile.h"
#include "tests/support/FakeSystemLog.h"
#include "tests/support/FakeViewMetrics.h"
#include "tests/support/PumpedQueues.h"
#include "tests/support/RecordingPresenter.h"

#include <string>
#include <vector>

namespace nimbra::test {

/// A platform for a pane under test: pumped queues, fakes that a test fills, and a record of what
/// the pane asks of its host.
struct TestPlatform {
    std::vector<std::string> calls;
    RecordingPresenter presenter{calls};
    FakeAccountStore accountStore;
    FakeDocumentContainers documentContainers;
    device::DeviceNotificationCenter notificationCenter;
    PumpedQueues workQueues;
    FakeFileManager fileManager{calls};
    FakeBundles bundles;
    ClassRegistry classes;
    FakeLocalization localization;
    FakeDeviceInfo deviceInfo;
    FakeRestrictionsProfile restrictions;
    FakePrivacyConsentStore privacyConsentStore{calls};
    FakeApplications applications;
    FakeAppTerminator appTerminator{calls};
    FakeSystemLog systemLog;
    FakeDistributedNotificationCenter distributedNotificationCenter;
    FakeDaemonConnection daemonConnection;
    FakeProgressReports progressReports{calls};
    FakeLastSync lastSync{calls};
    FakeClock clock;
    FakeViewMetrics viewMetrics;
    ViewAnimations viewAnimations;
    FakeDeviceListRequests deviceListRequests;
    FakePreferences preferences;
    FakeProcesses processes{calls};

    [[nodiscard]] PlatformServices services() {
        return {.presenter = presenter,
                .accountStore = accountStore,
                .documentContainers = documentContainers,
                .notificationCenter = notificationCenter,
                .workQueues = workQueues,
                .fileManager = fileManager,
                .bundles = bundles,
                .classes = classes,
                .localization = localization,
                .deviceInfo = deviceInfo,
                .restrictions = restrictions,
                .privacyConsentStore = privacyConsentStore,
                .applications = applications,
                .appTerminator = appTerminator,
                .systemLog = systemLog,
                .distributedNotificationCenter = distributedNotificationCenter,
                .daemonConnection = daemonConnection,
                .progressReports = progressReports,
                .lastSync = lastSync,
                .clock = clock,
                .viewMetrics = viewMetrics,
                .viewAnimations = viewAnimations,
                .deviceListRequests = deviceListRequests,
                .preferences = preferences,
                .processes = processes};
    }
};

} // namespace nimbra::test
