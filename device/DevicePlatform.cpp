#include "device/DevicePlatform.h"

#include "device/accounts/DeviceListService.h"
#include "device/apps/ApplicationFolders.h"
#include "device/apps/DeviceAppTerminator.h"
#include "device/apps/DeviceApplications.h"
#include "device/bundles/DeviceBundles.h"
#include "device/description/DescriptionFiles.h"
#include "device/documents/DeviceDaemonConnection.h"
#include "device/documents/DeviceDocumentContainers.h"
#include "device/documents/DeviceFileManager.h"
#include "device/documents/DeviceLastSync.h"
#include "device/documents/DeviceProgressReports.h"
#include "device/documents/ProgressFolder.h"
#include "device/documents/ProgressPublisher.h"
#include "device/files/Folders.h"
#include "device/store/DeviceAccountStore.h"
#include "device/store/DevicePrivacyConsentStore.h"
#include "device/system/DeviceAbilities.h"
#include "device/system/DeviceClock.h"
#include "device/system/DeviceDistributedNotificationCenter.h"
#include "device/system/DeviceLocalization.h"
#include "device/system/DeviceNotificationCenter.h"
#include "device/system/DevicePreferences.h"
#include "device/system/DeviceProcesses.h"
#include "device/system/DeviceRestrictions.h"
#include "device/system/DeviceSettings.h"
#include "device/system/DeviceSystemLog.h"
#include "device/system/DeviceWorkQueues.h"
#include "platform/system/ClassRegistry.h"

#include <utility>

namespace nimbra::device {

struct DevicePlatform::Databases {
    AccountDatabase accounts;
    std::filesystem::path consentPath;
    std::optional<ConsentDatabase> consent;

    [[nodiscard]] static std::expected<Databases, Error> open(const DevicePaths& paths);
};

std::expected<DevicePlatform::Databases, Error>
DevicePlatform::Databases::open(const DevicePaths& paths) {
    const auto accountsPath = paths.resolve(kAccountsDatabase);
    if (!accountsPath) {
        return std::unexpected(accountsPath.error());
    }
    auto accounts = AccountDatabase::open(*accountsPath);
    if (!accounts) {
        return std::unexpected(accounts.error());
    }
    auto consentPath = paths.resolve(kConsentDatabase);
    if (!consentPath) {
        return std::unexpected(consentPath.error());
    }
    auto consent = ConsentDatabase::open(*consentPath);
    if (!consent) {
        return std::unexpected(consent.error());
    }
    return Databases{.accounts = std::move(*accounts),
                     .consentPath = std::move(*consentPath),
                     .consent = std::move(*consent)};
}

/// The services, each behind those that it uses. The threads end before the first of them goes.
struct DevicePlatform::Parts {
    Parts(const DevicePaths& paths, DeviceSettings deviceSettings, Databases databases,
          WorkQueue& mainQueue, Options options)
        : systemLog(paths, options.keepsLogToItself ? DeviceSystemLog::Destination::fileAlone
                                                    : DeviceSystemLog::usualDestination()),
          settings(std::move(deviceSettings)), preferences(paths, systemLog),
          workQueues(mainQueue, std::move(options.timeSource)), clock(workQueues.timeSource()),
          distributedNotificationCenter(paths, systemLog),
          accountStore(std::move(databases.accounts), workQueues, systemLog),
          deviceListRequests(DeviceListFile(paths, systemLog), workQueues),
          bundles(paths, settings, classes, systemLog), localization(settings, systemLog),
          abilities(settings), restrictions(paths, systemLog),
          privacyConsentStore(std::move(databases.consentPath), std::move(databases.consent),
                              systemLog),
          applications(paths, applicationFolders(paths, processEnvironment), settings, systemLog),
          appTerminator(DeviceAppTerminator::waysOn(paths, systemLog), workQueues, systemLog),
          fileManager(paths, DocumentsFile(paths, systemLog)), processes(paths),
          documentContainers(paths, workQueues.serialQueueWithLabel("document-refresh"), systemLog),
          lastSync(paths, settings, clock), progressReports(mainQueue),
          progressPublisher(mainQueue, progressReports),
          progressFolder(paths, progressPublisher, daemonConnection.mobileDocumentsURL(),
                         systemLog) {
        // Who shows no progress needs no thread that looks for it.
        progressReports.setFirstSubscriptionHandler([this] { progressFolder.start(); });
    }

    DeviceSystemLog systemLog;
    DeviceSettings settings;
    DevicePreferences preferences;
    DeviceWorkQueues workQueues;
    DeviceClock clock;
    DeviceDistributedNotificationCenter distributedNotificationCenter;
    DeviceAccountStore accountStore;
    DeviceListService deviceListRequests;
    ClassRegistry classes;
    DeviceBundles bundles;
    DeviceLocalization localization;
    DeviceAbilities abilities;
    DeviceRestrictions restrictions;
    DevicePrivacyConsentStore privacyConsentStore;
    DeviceApplications applications;
    DeviceAppTerminator appTerminator;
    DeviceNotificationCenter notificationCenter;
    DeviceFileManager fileManager;
    DeviceProcesses processes;
    DeviceDocumentContainers documentContainers;
    DeviceDaemonConnection daemonConnection;
    DeviceLastSync lastSync;
    DeviceProgressReports progressReports;
    ProgressPublisher progressPublisher;
    ProgressFolder progressFolder;
};

namespace {

std::expected<void, Error> checkState(const DevicePaths& paths) {
    if (auto checked = checkStateFolder(paths); !checked) {
        return checked;
    }
    for (const DescriptionFile* file : {&restrictionsFile, &documentsFile}) {
        if (const auto description = readDescriptionFile(paths, *file); !description) {
            return std::unexpected(description.error());
        }
    }
    return {};
}

} // namespace

std::expected<std::unique_ptr<DevicePlatform>, Error>
DevicePlatform::open(const std::filesystem::path& root, WorkQueue& mainQueue, Options options) {
    const DevicePaths paths(root);
    if (const auto checked = checkState(paths); !checked) {
        return std::unexpected(checked.error());
    }
    auto settings = DeviceSettings::open(root);
    if (!settings) {
        return std::unexpected(settings.error());
    }
    if (const auto checked = checkPreferences(paths); !checked) {
        return std::unexpected(checked.error());
    }
    auto databases = Databases::open(paths);
    if (!databases) {
        return std::unexpected(databases.error());
    }
    return std::unique_ptr<DevicePlatform>(new DevicePlatform(std::make_unique<Parts>(
        paths, std::move(*settings), std::move(*databases), mainQueue, std::move(options))));
}

DevicePlatform::DevicePlatform(std::unique_ptr<Parts> parts) : _parts(std::move(parts)) {}

DevicePlatform::~DevicePlatform() {
    // In this order: what comes from outside queues work, and so may blocks that are let go.
    stopListening();
    _parts->workQueues.finish();
    // Views, which the handlers hold, may still ask services for something as they go.
    _parts->progressReports.finish();
}

void DevicePlatform::stopListening() {
    _parts->progressFolder.finish();
    _parts->distributedNotificationCenter.finish();
    _parts->deviceListRequests.finish();
    // Work that waits for a tool would keep the queues from ending.
    _parts->processes.finish();
}

PlatformServices DevicePlatform::servicesFor(const HostServices& host) {
    return {.presenter = host.presenter,
            .accountStore = _parts->accountStore,
            .documentContainers = _parts->documentContainers,
            .notificationCenter = _parts->notificationCenter,
            .workQueues = _parts->workQueues,
            .fileManager = _parts->fileManager,
            .bundles = _parts->bundles,
            .classes = _parts->classes,
            .localization = _parts->localization,
            .deviceInfo = _parts->abilities,
            .restrictions = _parts->restrictions,
            .privacyConsentStore = _parts->privacyConsentStore,
            .applications = _parts->applications,
            .appTerminator = _parts->appTerminator,
            .systemLog = _parts->systemLog,
            .distributedNotificationCenter = _parts->distributedNotificationCenter,
            .daemonConnection = _parts->daemonConnection,
            .progressReports = _parts->progressReports,
            .lastSync = _parts->lastSync,
            .clock = _parts->clock,
            .viewMetrics = host.viewMetrics,
            .viewAnimations = host.viewAnimations,
            .deviceListRequests = _parts->deviceListRequests,
            .preferences = _parts->preferences,
            .processes = _parts->processes};
}

DeviceAccountStore& DevicePlatform::accountStore() {
    return _parts->accountStore;
}

DeviceBundles& DevicePlatform::bundles() {
    return _parts->bundles;
}

DevicePrivacyConsentStore& DevicePlatform::privacyConsentStore() {
    return _parts->privacyConsentStore;
}

DeviceFileManager& DevicePlatform::fileManager() {
    return _parts->fileManager;
}

DeviceProcesses& DevicePlatform::processes() {
    return _parts->processes;
}

const DaemonConnection& DevicePlatform::daemonConnection() const {
    return _parts->daemonConnection;
}

ProgressPublisher& DevicePlatform::progressPublisher() {
    return _parts->progressPublisher;
}

DeviceSettings& DevicePlatform::settings() {
    return _parts->settings;
}

DeviceWorkQueues& DevicePlatform::workQueues() {
    return _parts->workQueues;
}

ClassRegistry& DevicePlatform::classes() {
    return _parts->classes;
}

SystemLog& DevicePlatform::systemLog() {
    return _parts->systemLog;
}

} // namespace nimbra::device
