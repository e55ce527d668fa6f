#include "platform/host/AccountSettingsPane.h"

#include "platform/accounts/AccountStore.h"
#include "platform/host/Presenter.h"

namespace nimbra {

void AccountSettingsPane::viewDidLoad() {
    SettingsListController::viewDidLoad();
    const auto calling = [this](void (AccountSettingsPane::*tapped)(const BarButtonItem&)) {
        return [weakPage = weak_from_this(), tapped](const BarButtonItem& sender) {
            if (const auto page = std::static_pointer_cast<AccountSettingsPane>(weakPage.lock())) {
                ((*page).*tapped)(sender);
            }
        };
    };
    navigationItem().setLeftBarButtonItem(
        BarButtonItem{.title = {},
                      .systemItem = BarButtonSystemItem::cancel,
                      .action = calling(&AccountSettingsPane::cancelButtonTapped)});
    navigationItem().setRightBarButtonItem(
        BarButtonItem{.title = {},
                      .systemItem = BarButtonSystemItem::done,
                      .action = calling(&AccountSettingsPane::doneButtonTapped)});
}

void AccountSettingsPane::cancelButtonTapped(const BarButtonItem& /*sender*/) {
    dismissAnimated(true);
}

void AccountSettingsPane::doneButtonTapped(const BarButtonItem& /*sender*/) {
    dismissAnimated(true);
}

// The base page has nothing of its own to do around a save.

void AccountSettingsPane::operationsHelperWillSaveAccount(
    AccountOperationsHelper& /*helper*/, const std::shared_ptr<Account>& /*account*/) {}

void AccountSettingsPane::operationsHelperDidSaveAccountWithSuccessError(
    AccountOperationsHelper& /*helper*/, const std::shared_ptr<Account>& /*account*/,
    const std::expected<void, Error>& /*saved*/) {}

AccountOperationsHelper& AccountSettingsPane::accountOperationsHelper() {
    if (!_accountOperationsHelper) {
        _accountOperationsHelper = accountStore().operationsHelperWithDelegate(
            std::static_pointer_cast<AccountSettingsPane>(shared_from_this()));
    }
    return *_accountOperationsHelper;
}

void AccountSettingsPane::showActivityInProgressUIWithMessage(const Text& message) {
    services().presenter->showActivityInProgress(message);
}

void AccountSettingsPane::hideActivityInProgressUI() {
    services().presenter->hideActivityInProgress();
}

} // namespace nimbra
