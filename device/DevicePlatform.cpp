#include "device/DevicePlatform.h"

#include "device/DeviceError.h"
#include "device/bundles/DeviceBundles.h"
#include "device/description/DescriptionFiles.h"
#include "device/documents/DeviceDocumentContainers.h"
#include "device/documents/DeviceFileManager.h"
#include "device/store/DeviceAccountStore.h"
#include "device/system/DeviceAbilities.h"
#include "device/system/DeviceLocalization.h"
#include "device/system/DeviceNotificationCenter.h"
#include "device/system/DevicePreferences.h"
#include "device/system/DeviceRestrictions.h"
#include "device/system/DeviceSettings.h"
#include "device/system/DeviceSystemLog.h"
#include "device/system/DeviceWorkQueues.h"
#include "platform/system/ClassRegistry.h"

#include <system_error>
#include <utility>

namespace nimbra::device {

/// The services, each behind those that it uses. The threads end before the first of them goes.
struct DevicePlatform::Parts {
    Parts(const DevicePaths& paths, DeviceSettings deviceSettings, AccountDatabase accounts,
          WorkQueue& mainQueue)
        : systemLog(paths, DeviceSystemLog::usualDestination()),
          settings(std::move(deviceSettings)), preferences(paths, systemLog), workQueues(mainQueue),
          accountStore(std::move(accounts), workQueues, systemLog), bundles(settings, classes),
          localization(settings, systemLog), abilities(settings), restrictions(paths, systemLog),
          fileManager(DocumentsFile(paths, systemLog)),
          documentContainers(paths, workQueues.serialQueueWithLabel("document-refresh"),
                             systemLog) {}

    DeviceSystemLog systemLog;
    DeviceSettings settings;
    DevicePreferences preferences;
    DeviceWorkQueues workQueues;
    DeviceAccountStore accountStore;
    ClassRegistry classes;
    DeviceBundles bundles;
    DeviceLocalization localization;
    DeviceAbilities abilities;
    DeviceRestrictions restrictions;
    DeviceNotificationCenter notificationCenter;
    DeviceFileManager fileManager;
    DeviceDocumentContainers documentContainers;
};

namespace {

std::expected<void, Error> checkState(const DevicePaths& paths) {
    const auto state = paths.resolve(kStateDirectory);
    if (!state) {
        return std::unexpected(state.error());
    }
    std::error_code failure;
    if (!std::filesystem::is_directory(*state, failure)) {
        return std::unexpected(deviceError(paths.root().string() +
                                           ": not a device directory: it has no folder " +
                                           std::string(kStateDirectory.substr(1))));
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
DevicePlatform::open(const std::filesystem::path& root, WorkQueue& mainQueue) {
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
    const auto database = paths.resolve(kAccountsDatabase);
    if (!database) {
        return std::unexpected(database.error());
    }
    auto accounts = AccountDatabase::open(*database);
    if (!accounts) {
        return std::unexpected(accounts.error());
    }
    return std::unique_ptr<DevicePlatform>(new DevicePlatform(
        std::make_unique<Parts>(paths, std::move(*settings), std::move(*accounts), mainQueue)));
}

DevicePlatform::DevicePlatform(std::unique_ptr<Parts> parts) : _parts(std::move(parts)) {}

DevicePlatform::~DevicePlatform() {
    _parts->workQueues.finish();
}

PlatformServices DevicePlatform::servicesFor(Presenter& presenter) {
    return {.presenter = presenter,
            .accountStore = _parts->accountStore,
            .documentContainers = _parts->documentContainers,
            .notificationCenter = _parts->notificationCenter,
            .workQueues = _parts->workQueues,
            .fileManager = _parts->fileManager,
            .bundles = _parts->bundles,
            .localization = _parts->localization,
            .deviceInfo = _parts->abilities,
            .restrictions = _parts->restrictions,
            .systemLog = _parts->systemLog};
}

DeviceAccountStore& DevicePlatform::accountStore() {
    return _parts->accountStore;
}

DeviceBundles& DevicePlatform::bundles() {
    return _parts->bundles;
}

const DevicePreferences& DevicePlatform::preferences() const {
    return _parts->preferences;
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
