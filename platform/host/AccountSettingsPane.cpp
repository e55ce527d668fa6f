#include "platform/host/AccountSettingsPane.h"

#include "platform/accounts/AccountStore.h"
#include "platform/host/Presenter.h"

namespace nimbra {

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
