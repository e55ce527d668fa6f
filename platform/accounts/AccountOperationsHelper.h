#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <memory>

namespace nimbra {

class Account;
class AccountOperationsHelper;

/// Is told when a helper saves an account: `operationsHelperWillSaveAccount`, then
/// `operationsHelperDidSaveAccountWithSuccessError`, once each a save, on a queue of the helper's
/// that is never the main queue.
class AccountOperationsHelperDelegate {
public:
    virtual ~AccountOperationsHelperDelegate() = default;

    /// `account` is about to be saved. The save waits until this returns, so it may wait for the
    /// main queue.
    virtual void operationsHelperWillSaveAccount(AccountOperationsHelper& helper,
                                                 const std::shared_ptr<Account>& account) = 0;
    /// The save of `account` is over; `saved` holds the error of one that failed.
    virtual void
    operationsHelperDidSaveAccountWithSuccessError(AccountOperationsHelper& helper,
                                                   const std::shared_ptr<Account>& account,
                                                   const std::expected<void, Error>& saved) = 0;
};

/// Saves accounts for a page and tells the page's delegate, which it holds weakly. Any queue.
class AccountOperationsHelper {
public:
    AccountOperationsHelper() = default;
    AccountOperationsHelper(const AccountOperationsHelper&) = delete;
    AccountOperationsHelper& operator=(const AccountOperationsHelper&) = delete;
    virtual ~AccountOperationsHelper() = default;

    /// Writes the changes that `account` carries to the store, after checking the account with its
    /// service where `requireVerification` says so. Returns at once. A save that has been asked for
    /// is made even when the helper and its delegate have gone.
    virtual void saveAccountRequireVerification(const std::shared_ptr<Account>& account,
                                                bool requireVerification) = 0;
};

} // namespace nimbra
