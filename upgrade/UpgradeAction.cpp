// What happens when the user upgrades, or leaves.
#include "platform/accounts/AccountStore.h"
#include "platform/host/AccountAlertView.h"
#include "platform/host/AlertController.h"
#include "platform/system/WorkQueues.h"
#include "support/LogMessages.h"
#include "upgrade/RSPUpgradeViewController.h"
#include "upgrade/RSPUpgradeViewControllerDelegate.h"

namespace nimbra {

void RSPUpgradeViewController::_upgradeButtonWasTapped(const std::shared_ptr<Button>& /*sender*/) {
    // Looked up from top to bottom: missing texts are told in this order.
    const Text title = _localizedString("CLOUD_DRIVE_ALERT_TITLE");
    const Text message = _localizedString("CLOUD_DRIVE_ALERT_MESSAGE");
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        title, message, AlertControllerStyle::alert);
    alert->addAction(AlertAction::actionWithTitleStyleHandler(_localizedString("CANCEL"),
                                                              AlertActionStyle::cancel, {}));
    alert->addAction(AlertAction::actionWithTitleStyleHandler(
        _localizedString("CONTINUE"), AlertActionStyle::standard,
        [screen = sharedFromThis()] { screen->_upgrade(); }));
    presentViewControllerAnimated(alert, true);
}

void RSPUpgradeViewController::_upgrade() {
    showActivityInProgressUIWithMessage(_localizedString("UPGRADING_TO_CLOUD_DRIVE"));
    const std::shared_ptr<Account> account = _account();
    writeLogMessage(services().systemLog, log_messages::markingAccount);
    if (account) {
        account->vt_setUsesStratafile(true);
    }
    writeLogMessage(services().systemLog, log_messages::enablingDataclasses);
    if (account) {
        account->setEnabledForDataclass(true, kAccountDataclassTidewater);
        account->setEnabledForDataclass(true, kAccountDataclassTSYDatabaseService);
        account->setEnabledForDataclass(true, kAccountDataclassTSYDeviceService);
        account->setEnabledForDataclass(true, kAccountDataclassTSYShareService);
    }
    accountStore().saveAccount(
        account, {.doVerify = false,
                  .completion = [screen = sharedFromThis(),
                                 account](const std::expected<void, Error>& saved) {
                      screen->_handleSaveCompletionForAccountSuccessError(account, saved);
                  }});
}

// What went wrong is not told: a failed upgrade is all that the user can do something about. The
// changes of the account in memory stay.
void RSPUpgradeViewController::_handleSaveCompletionForAccountSuccessError(
    const std::shared_ptr<Account>& /*account*/, const std::expected<void, Error>& saved) {
    services().workQueues->mainQueue().async(
        [screen = sharedFromThis(), success = saved.has_value()] {
            screen->hideActivityInProgressUI();
            if (!success) {
                screen->_showFailedUpgradeAlert();
                return;
            }
            if (const auto delegate = screen->delegate()) {
                delegate->upgradeViewControllerDidSucceed(screen);
                return;
            }
            if (const auto parent = screen->parentController()) {
                parent->reloadSpecifiers();
            }
            screen->dismissAnimated(true);
        });
}

void RSPUpgradeViewController::_showFailedUpgradeAlert() {
    const Text title = _localizedString("FAILED_MIGRATION_CLOUD_DRIVE");
    const auto alert = std::make_shared<AccountAlertView>(
        services(), title,
        AccountAlertView::Content{.message =
                                      _localizedString("FAILED_MIGRATION_CLOUD_DRIVE_DESCRIPTION"),
                                  .buttonTitle = _localizedString("OK"),
                                  .action = [screen = sharedFromThis()] { screen->_dismiss(); }});
    alert->show();
}

void RSPUpgradeViewController::cancelButtonTapped(const BarButtonItem& /*sender*/) {
    _dismiss();
}

// A failed upgrade ends here as well: to the delegate it is the same as a cancelled one.
void RSPUpgradeViewController::_dismiss() {
    if (const auto delegate = this->delegate()) {
        delegate->upgradeViewControllerDidCancel(sharedFromThis());
    } else {
        dismissAnimated(true);
    }
}

} // namespace nimbra
