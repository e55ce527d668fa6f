#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/AccountStore.h"
#include "platform/system/DeviceInfo.h"
#include "platform/system/RestrictionsProfile.h"
#include "platform/system/WorkQueues.h"
#include "support/LogMessages.h"

namespace nimbra {

std::optional<SpecifierArray>
RSPNimbraDriveViewController::_createSpecifiersForCellularSwitchCell() {
    const DeviceInfo& deviceInfo = services().deviceInfo;
    if (!deviceInfo.boolAnswerForQuestion("cellular-data")) {
        return std::nullopt;
    }
    const auto group = Specifier::groupSpecifierWithID("RSPCellular");
    group->setPropertyForKey(_localizedString(deviceInfo.VariantStringKeyForKey(
                                 "CLOUD_DRIVE_CELLULAR_EXPLANATION_WIFI")),
                             FooterTextGroupKey);

    const auto row = Specifier::preferenceSpecifierNamed(
        _localizedString("CLOUD_DRIVE_CELLULAR"),
        {.target = this,
         .set = [this](const RowValue& value,
                       const auto& specifier) { _setUseCellularForSpecifier(value, specifier); },
         .get = [this](const Specifier& specifier) { return _useCellular(specifier); },
         .cell = SwitchCell});
    row->setPropertyForKey(services().restrictions->isAppCellularDataModificationAllowed(),
                           EnabledKey);
    return SpecifierArray{group, row};
}

/// On only when both data classes may use cellular data.
RowValue RSPNimbraDriveViewController::_useCellular(const Specifier& /*row*/) {
    const std::shared_ptr<Account> account = _vantrelAccount();
    return account && account->vt_useCellularForDataclass(kAccountDataclassTidewater) &&
           account->vt_useCellularForDataclass(kAccountDataclassKeyValue);
}

void RSPNimbraDriveViewController::_setUseCellularForSpecifier(
    const RowValue& value, const std::shared_ptr<Specifier>& row) {
    const std::shared_ptr<Account> account = _vantrelAccount();
    if (!account) {
        return;
    }
    // Both are written, also where one has the value already: they may have differed.
    account->vt_setUseCellularForDataclass(boolValue(value), kAccountDataclassTidewater);
    account->vt_setUseCellularForDataclass(boolValue(value), kAccountDataclassKeyValue);

    // The setup flow saves the account itself when it is complete.
    if (_isFirstSetup) {
        return;
    }
    const auto pane = std::static_pointer_cast<RSPNimbraDriveViewController>(shared_from_this());
    accountStore().saveVerifiedAccountWithCompletionHandler(
        account, [pane, account, row](const std::expected<void, Error>& saved) {
            SystemLog& log = pane->services().systemLog;
            if (saved) {
                writeLogMessage(log, log_messages::updatedCellularFlag);
                return;
            }
            writeLogMessage(log, log_messages::failedToUpdateCellularFlag, saved.error().line());
            account->reload();
            pane->services().workQueues->mainQueue().async(
                [pane, row] { pane->reloadSpecifierAnimated(row, false); });
        });
}

} // namespace nimbra
