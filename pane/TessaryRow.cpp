#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/Account.h"
#include "platform/system/Bundles.h"
#include "platform/system/ClassRegistry.h"
#include "platform/system/FileManager.h"
#include "support/LogMessages.h"
#include "support/RSPLocalizedFormat.h"

#include <filesystem>
#include <utility>

namespace nimbra {

namespace {

constexpr const char* controllerClassName = "TSYSettingsController";

} // namespace

std::shared_ptr<Specifier> RSPNimbraDriveViewController::_specifierForTessary() {
    const std::shared_ptr<Account> account = _vantrelAccount();
    if (!account || !account->vt_isPrimaryAccount() ||
        !account->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService)) {
        return nullptr;
    }
    _loadTessarySettingsBundleIfNeeded();
    const ControllerClass* const detail = services().classes->classNamed(controllerClassName);
    const auto row = Specifier::preferenceSpecifierNamed(
        _localizedString("CLOUD_DRIVE_PRIVACY_INFO"),
        {.target = this,
         .get = [this](const Specifier& specifier) { return _valueForTessarySpecifier(specifier); },
         .detail = detail,
         .cell = LinkListCell});

    // The page behind the row is opened as this one was, but on another account.
    UserInfo userInfo = specifier()->userInfo();
    if (auto tessaryAccount = account->vt_tessaryAccount()) {
        userInfo.insert_or_assign(AccountKey, std::move(tessaryAccount));
        row->setUserInfo(std::move(userInfo));
    }
    return row;
}

void RSPNimbraDriveViewController::_loadTessarySettingsBundleIfNeeded() {
    const std::filesystem::path root = services().fileManager->SystemRootDirectory().string();
    const auto path =
        root / "System/Library/PreferenceBundles/AccountSettings" / "TessarySettings.bundle";
    const std::shared_ptr<Bundle> bundle = services().bundles->bundleWithPath(path.string());
    if (bundle && bundle->isLoaded()) {
        return;
    }
    writeLogMessage(services().systemLog, log_messages::loadingTessaryBundle);
    if (bundle) {
        // Without its class the row leads nowhere, whatever the reason.
        static_cast<void>(bundle->load());
    }
}

/// How many groups of applications use the cloud database; nothing while nobody can tell.
std::optional<std::int64_t> RSPNimbraDriveViewController::_numberOfAppsUsingTessary() {
    const ControllerClass* controllerClass = services().classes->classNamed(controllerClassName);
    if (controllerClass == nullptr) {
        return std::nullopt;
    }
    const auto operation = controllerClass->classOperations.find("tessaryNumAppGroups");
    // The class may be anybody's: its operation need not be there.
    if (operation == controllerClass->classOperations.end() || !operation->second) {
        return std::nullopt;
    }
    const RowValue answer = operation->second();
    const auto* number = std::get_if<std::int64_t>(&answer);
    return number != nullptr ? std::optional(*number) : std::nullopt;
}

RowValue RSPNimbraDriveViewController::_valueForTessarySpecifier(const Specifier& /*row*/) {
    const std::int64_t count = _numberOfAppsUsingTessary().value_or(0);
    if (count < 1) {
        return Text("");
    }
    // The text takes a number of 32 bits, and a larger one loses its upper bits.
    const auto shownCount = static_cast<std::int32_t>(count);
    return RSPLocalizedFormat("CLOUD_DRIVE_NUM_APPS", "Localizable", _paneBundle(),
                              services().localization, {std::int64_t{shownCount}});
}

} // namespace nimbra
