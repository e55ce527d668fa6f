#pragma once

#include "platform/accounts/Account.h"

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
};

} // namespace nimbra
