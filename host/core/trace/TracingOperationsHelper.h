#pragma once

#include "platform/accounts/AccountOperationsHelper.h"

#include <memory>

namespace nimbra {
class AccountStore;
}

namespace nimbra::host {

class Trace;

/// Stands between a page and its helper: traces the start of a save when the page asks for it, and
/// its end before the page is told.
class TracingOperationsHelper final : public AccountOperationsHelper,
                                      public AccountOperationsHelperDelegate,
                                      public std::enable_shared_from_this<TracingOperationsHelper> {
public:
    /// A helper of `store` for `delegate`. Neither `store` nor `trace` is owned; both outlive it.
    [[nodiscard]] static std::shared_ptr<TracingOperationsHelper>
    make(AccountStore& store, std::weak_ptr<AccountOperationsHelperDelegate> delegate,
         Trace& trace);

    void saveAccountRequireVerification(const std::shared_ptr<Account>& account,
                                        bool requireVerification) override;

    void operationsHelperWillSaveAccount(AccountOperationsHelper& helper,
                                         const std::shared_ptr<Account>& account) override;
    void operationsHelperDidSaveAccountWithSuccessError(
        AccountOperationsHelper& helper, const std::shared_ptr<Account>& account,
        const std::expected<void, Error>& saved) override;

private:
    TracingOperationsHelper(std::weak_ptr<AccountOperationsHelperDelegate> delegate, Trace& trace);

    std::weak_ptr<AccountOperationsHelperDelegate> _delegate;
    Trace& _trace;
    std::shared_ptr<AccountOperationsHelper> _helper;
    /// Who was told of the start of a save, held until it is told of the end.
    std::shared_ptr<AccountOperationsHelperDelegate> _told;
};

} // namespace nimbra::host
