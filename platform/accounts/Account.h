#pragma once

#include "platform/accounts/Dataclass.h"
#include "platform/values/Identifier.h"

#include <memory>

namespace nimbra {

/// A cloud account as the pane shows and edits it: a copy in memory of what the store holds.
/// Changes stay in the object until the account is saved; they are lost with the object.
/// Any queue: a save reads the object while the page shows it.
class Account {
public:
    Account() = default;
    Account(const Account&) = delete;
    Account& operator=(const Account&) = delete;
    virtual ~Account() = default;

    [[nodiscard]] virtual const AccountIdentifier& identifier() const = 0;

    /// Whether it is the account of the device's user; any other one was added beside it.
    [[nodiscard]] virtual bool vt_isPrimaryAccount() const = 0;
    /// Whether the account's service offers data of this class, switched on or not. False for a
    /// class that the account does not know.
    [[nodiscard]] virtual bool isProvisionedForDataclass(const Dataclass& dataclass) const = 0;
    /// The account under which the service of the cloud database knows the user; null for none.
    /// Each call may give another object.
    [[nodiscard]] virtual std::shared_ptr<Account> vt_tessaryAccount() const = 0;

    /// Whether the account carries data of this class. False for a class it does not know.
    [[nodiscard]] virtual bool isEnabledForDataclass(const Dataclass& dataclass) const = 0;
    /// Sets the flag in this object only; nothing is written to the store.
    virtual void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) = 0;

    /// Whether the account has moved from the older document storage to the new document service.
    [[nodiscard]] virtual bool vt_isUsingStratafile() const = 0;
    /// Sets the flag in this object only; nothing is written to the store.
    virtual void vt_setUsesStratafile(bool usesStratafile) = 0;

    /// Whether data of this class may be synced over cellular data. False for a class that the
    /// account does not know.
    [[nodiscard]] virtual bool vt_useCellularForDataclass(const Dataclass& dataclass) const = 0;
    /// Sets the flag in this object only; nothing is written to the store.
    virtual void vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) = 0;

    /// Drops the changes that were not saved and reads what the store holds now. Where the store
    /// cannot be read the changes are dropped all the same, and the store logs the reason.
    virtual void reload() = 0;
};

} // namespace nimbra
