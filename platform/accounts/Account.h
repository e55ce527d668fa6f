#pragma once

#include "platform/accounts/Dataclass.h"
#include "platform/values/Identifier.h"

namespace nimbra {

/// A cloud account as the pane shows and edits it: a copy in memory of what the store holds.
/// Changes stay in the object until the account is saved; they are lost with the object.
/// Not thread-safe: one queue at a time.
class Account {
public:
    Account() = default;
    Account(const Account&) = delete;
    Account& operator=(const Account&) = delete;
    virtual ~Account() = default;

    [[nodiscard]] virtual const AccountIdentifier& identifier() const = 0;

    /// Whether the account carries data of this class. False for a class it does not know.
    [[nodiscard]] virtual bool isEnabledForDataclass(const Dataclass& dataclass) const = 0;
    /// Sets the flag in this object only; nothing is written to the store.
    virtual void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) = 0;

    /// Whether the account has moved from the older document storage to the new document service.
    [[nodiscard]] virtual bool vt_isUsingStratafile() const = 0;
};

} // namespace nimbra
