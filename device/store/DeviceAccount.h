#pragma once

#include "platform/accounts/Account.h"

#include <set>

namespace nimbra::device {

/// An account as the device's store gave it out.
class DeviceAccount final : public Account {
public:
    /// What the store keeps of an account.
    struct Record {
        AccountIdentifier identifier;
        bool usesStratafile = false;
        std::set<Dataclass> enabled;
    };

    explicit DeviceAccount(Record record);

    [[nodiscard]] const AccountIdentifier& identifier() const override;
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override;
    void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) override;
    [[nodiscard]] bool vt_isUsingStratafile() const override;

private:
    Record _record;
};

} // namespace nimbra::device
