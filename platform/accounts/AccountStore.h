#pragma once

#include "platform/accounts/Account.h"
#include "platform/accounts/AccountOperationsHelper.h"
#include "platform/values/Error.h"

#include <expected>
#include <functional>
#include <memory>

namespace nimbra {

/// The device's accounts.
class AccountStore {
public:
    virtual ~AccountStore() = default;

    /// A fresh object with what the store holds for `identifier`, owned by the caller alone.
    /// Null when there is no such account, and when the store cannot be read; the store then
    /// writes the reason to the system log itself. Reads at once, on the calling queue; any queue.
    [[nodiscard]] virtual std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) = 0;

    /// Is told once how a save ended, on a queue of the store's choosing.
    using SaveCompletion = std::function<void(const std::expected<void, Error>& saved)>;

    /// Writes the changes that `account`, which the user has verified before, carries. All of them
    /// are written or none. Returns at once; the store holds the account until `completion` has
    /// run. Any queue.
    virtual void saveVerifiedAccountWithCompletionHandler(const std::shared_ptr<Account>& account,
                                                          SaveCompletion completion) = 0;

    /// A new helper that saves accounts to this store for a page and tells `delegate`. Any queue.
    [[nodiscard]] virtual std::shared_ptr<AccountOperationsHelper>
    operationsHelperWithDelegate(std::weak_ptr<AccountOperationsHelperDelegate> delegate) = 0;
};

} // namespace nimbra
