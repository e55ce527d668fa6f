#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/Account.h"
#include "platform/accounts/AccountOperationsHelper.h"
#include "platform/system/WorkQueues.h"

namespace nimbra {

bool RSPNimbraDriveViewController::_isTidewaterEnabled() {
    const std::shared_ptr<Account> account = _vantrelAccount();
    return account && account->isEnabledForDataclass(kAccountDataclassTidewater);
}

RowValue RSPNimbraDriveViewController::_documentsAndDataEnabled(const Specifier* /*row*/) {
    return _isTidewaterEnabled();
}

void RSPNimbraDriveViewController::_setDocumentsAndDataEnabledForSpecifier(
    const RowValue& value, const std::shared_ptr<Specifier>& /*row*/) {
    _setDocumentsAndDataEnabled(boolValue(value));
}

void RSPNimbraDriveViewController::_setDocumentsAndDataEnabled(bool enabled) {
    const std::shared_ptr<Account> account = _vantrelAccount();
    if (!account || account->isEnabledForDataclass(kAccountDataclassTidewater) == enabled) {
        return;
    }
    account->setEnabledForDataclass(enabled, kAccountDataclassTidewater);

    // The photo stream cannot do without document storage. It is never switched on here: whether
    // it was wanted before is not known.
    const bool turnsLarderOff = !enabled && account->isEnabledForDataclass(kAccountDataclassLarder);
    if (turnsLarderOff) {
        account->setEnabledForDataclass(false, kAccountDataclassLarder);
    }

    // The setup flow saves the account itself when it is complete.
    if (!_isFirstSetup) {
        accountOperationsHelper().saveAccountRequireVerification(account, false);
    }

    // The photo stream has a row on a page further up.
    if (turnsLarderOff) {
        reloadAllParentSpecifiers();
    } else {
        reloadParentSpecifier();
    }
}

void RSPNimbraDriveViewController::operationsHelperWillSaveAccount(
    AccountOperationsHelper& helper, const std::shared_ptr<Account>& account) {
    const bool turnsOn = account->isEnabledForDataclass(kAccountDataclassTidewater);
    services().workQueues->mainQueue().sync([this, turnsOn] {
        showActivityInProgressUIWithMessage(
            _localizedString(turnsOn ? "TURNING_ON_CLOUD_DRIVE" : "TURNING_OFF_CLOUD_DRIVE"));
    });
    AccountSettingsPane::operationsHelperWillSaveAccount(helper, account);
}

// The main queue keeps the order: the rows, or the switch, change first, then the busy indicator
// goes. The work holds the pane, so that the indicator goes even when the pane was closed
// meanwhile.
void RSPNimbraDriveViewController::operationsHelperDidSaveAccountWithSuccessError(
    AccountOperationsHelper& helper, const std::shared_ptr<Account>& account,
    const std::expected<void, Error>& saved) {
    WorkQueue& mainQueue = services().workQueues->mainQueue();
    const auto pane = std::static_pointer_cast<RSPNimbraDriveViewController>(shared_from_this());
    if (saved) {
        mainQueue.async(
            [pane] { pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState(); });
    } else {
        // All that the user is told is that the switch goes back.
        _reloadVantrelAccount();
        mainQueue.async(
            [pane] { pane->reloadSpecifierAnimated(pane->_NimbraDriveSpecifier, true); });
    }
    AccountSettingsPane::operationsHelperDidSaveAccountWithSuccessError(helper, account, saved);
    mainQueue.async([pane] { pane->hideActivityInProgressUI(); });
}

} // namespace nimbra
