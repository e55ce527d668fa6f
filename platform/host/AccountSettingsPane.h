#pragma once

#include "platform/accounts/AccountOperationsHelper.h"
#include "platform/host/SettingsListController.h"

#include <memory>

namespace nimbra {

class AccountStore;

/// The base of the pages that show and edit one account. Main queue only, but for the callbacks of
/// its helper, which come on the helper's queue.
class AccountSettingsPane : public SettingsListController, public AccountOperationsHelperDelegate {
public:
    using SettingsListController::SettingsListController;

    /// Puts "Cancel" and "Done" into the bar, for pages that do not say otherwise.
    void viewDidLoad() override;

    /// What the bar's buttons call: by default each leaves the page.
    virtual void cancelButtonTapped(const BarButtonItem& sender);
    virtual void doneButtonTapped(const BarButtonItem& sender);

    /// The ends of a save that the page has asked its helper for. An override calls its base's.
    void operationsHelperWillSaveAccount(AccountOperationsHelper& helper,
                                         const std::shared_ptr<Account>& account) override;
    void operationsHelperDidSaveAccountWithSuccessError(
        AccountOperationsHelper& helper, const std::shared_ptr<Account>& account,
        const std::expected<void, Error>& saved) override;

protected:
    /// The store that the page's account comes from.
    [[nodiscard]] AccountStore& accountStore() const { return services().accountStore; }

    /// Saves the page's account and tells the page; made on the first call, owned by the page.
    [[nodiscard]] AccountOperationsHelper& accountOperationsHelper();

    /// Covers the page with a busy indicator and `message`, and takes it away.
    void showActivityInProgressUIWithMessage(const Text& message);
    void hideActivityInProgressUI();

private:
    std::shared_ptr<AccountOperationsHelper> _accountOperationsHelper;
};

} // namespace nimbra
