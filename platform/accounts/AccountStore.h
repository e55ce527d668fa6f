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

    /// How an account is saved, and who is told.
    struct SaveOptions {
        /// Whether the account is checked with its service before.
        bool doVerify = false;
        SaveCompletion completion;
    };
    /// Writes the changes that `account` carries, all of them or none; the data of data classes
    /// stays as it is. Returns at once; the store holds the account until the completion has run.
    /// A null account is one that cannot be saved. Any queue.
    virtual void saveAccount(const std::shared_ptr<Account>& account, SaveOptions options) = 0;

    /// A new helper that saves accounts to this store for a page and tells `delegate`. Any queue.
    [[nodiscard]] virtual std::shared_ptr<AccountOperationsHelper>
    operationsHelperWithDelegate(std::weak_ptr<AccountOperationsHelperDelegate> delegate) = 0;
};

} // namespace nimbra
