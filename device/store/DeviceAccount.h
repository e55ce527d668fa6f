#pragma once

#include "device/store/AccountRecord.h"
#include "platform/accounts/Account.h"

#include <memory>
#include <mutex>

namespace nimbra::device {

class DeviceAccountStore;

/// An account as the device's store gave it out, and what has been changed on it since. Any thread.
class DeviceAccount final : public Account {
public:
    /// `store`, to which the account belongs, outlives it.
    DeviceAccount(AccountRecord record, DeviceAccountStore& store);

    [[nodiscard]] const AccountIdentifier& identifier() const override;
    [[nodiscard]] bool vt_isPrimaryAccount() const override;
    [[nodiscard]] bool isProvisionedForDataclass(const Dataclass& dataclass) const override;
    /// As the store has it; one that the store does not hold has its identifier and nothing more.
    [[nodiscard]] std::shared_ptr<Account> vt_tessaryAccount() const override;
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override;
    void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) override;
    [[nodiscard]] bool vt_isUsingStratafile() const override;
    void vt_setUsesStratafile(bool usesStratafile) override;
    [[nodiscard]] bool vt_useCellularForDataclass(const Dataclass& dataclass) const override;
    void vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) override;
    void reload() override;

    /// What was changed and not saved.
    [[nodiscard]] AccountChanges changes() const;
    /// Takes `saved` as what the store holds now; what was changed otherwise since then stays a
    /// change.
    void didSave(const AccountChanges& saved);

private:
    const AccountIdentifier _identifier;
    DeviceAccountStore& _store;
    mutable std::mutex _mutex;
    AccountRecord _record;
    AccountChanges _changes;
};

} // namespace nimbra::device
