#pragma once

#include "platform/accounts/AccountStore.h"

#include <memory>

namespace nimbra::host {

class Trace;

/// Traces what is asked of another account store, and what is changed on its accounts.
class TracingAccountStore final : public AccountStore {
public:
    /// Neither is owned; both outlive the store, and `trace` its accounts as well.
    TracingAccountStore(AccountStore& store, Trace& trace) : _store(store), _trace(trace) {}

    [[nodiscard]] std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) override;

    void saveVerifiedAccountWithCompletionHandler(const std::shared_ptr<Account>& account,
                                                  SaveCompletion completion) override;
    void saveAccount(const std::shared_ptr<Account>& account, SaveOptions options) override;
    [[nodiscard]] std::shared_ptr<AccountOperationsHelper>
    operationsHelperWithDelegate(std::weak_ptr<AccountOperationsHelperDelegate> delegate) override;

    /// An account that stands for `account` and traces its changes; null for null.
    [[nodiscard]] std::shared_ptr<Account> traced(std::shared_ptr<Account> account) const;

private:
    /// Traces the start of a save, and makes of `completion` one that traces its end.
    [[nodiscard]] SaveCompletion traceSave(const char* operation,
                                           const std::shared_ptr<Account>& account,
                                           SaveCompletion completion) const;

    AccountStore& _store;
    Trace& _trace;
};

} // namespace nimbra::host
