#pragma once

#include "platform/accounts/Account.h"

#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// An account that a test fills as it needs it.
class FakeAccount final : public Account {
public:
    explicit FakeAccount(std::string identifier) : _identifier(std::move(identifier)) {}

    [[nodiscard]] const AccountIdentifier& identifier() const override { return _identifier; }
    [[nodiscard]] bool vt_isPrimaryAccount() const override { return flags.isPrimary; }
    [[nodiscard]] bool isProvisionedForDataclass(const Dataclass& dataclass) const override {
        return flags.provisioned.contains(dataclass);
    }
    [[nodiscard]] std::shared_ptr<Account> vt_tessaryAccount() const override {
        return flags.tessaryAccount.empty() ? nullptr
                                            : std::make_shared<FakeAccount>(flags.tessaryAccount);
    }
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override {
        return flags.enabled.contains(dataclass);
    }
    void setEnabledForDataclass(bool enabled, const Dataclass& dataclass) override {
        set(flags.enabled, dataclass, enabled);
        changes.push_back((enabled ? "enable " : "disable ") + dataclass.string());
    }
    [[nodiscard]] bool vt_isUsingStratafile() const override { return flags.usesStratafile; }
    void vt_setUsesStratafile(bool usesStratafile) override {
        flags.usesStratafile = usesStratafile;
        changes.emplace_back("uses stratafile: " + std::string(usesStratafile ? "yes" : "no"));
    }
    [[nodiscard]] bool vt_useCellularForDataclass(const Dataclass& dataclass) const override {
        cellularReads.push_back(dataclass);
        return flags.cellular.contains(dataclass);
    }
    void vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) override {
        set(flags.cellular, dataclass, useCellular);
        cellularWrites.push_back((useCellular ? "allow " : "forbid ") + dataclass.string());
    }
    void reload() override {
        ++reloads;
        flags = *stored;
    }

    struct Flags {
        std::set<Dataclass> enabled;
        std::set<Dataclass> cellular;
        bool usesStratafile = true;
        std::set<Dataclass> provisioned;
        bool isPrimary = false;
        /// The identifier of its account of the cloud database; empty for none.
        std::string tessaryAccount;
    };
    Flags flags;
    /// What a reload brings back; owned by the store that gave the account out.
    const Flags* stored = nullptr;
    int reloads = 0;
    /// What was changed of its services, in order.
    std::vector<std::string> changes;
    /// The data classes of which it was asked whether they may use cellular data, in order.
    mutable std::vector<Dataclass> cellularReads;
    /// What was changed of that, in order.
    std::vector<std::string> cellularWrites;

private:
    static void set(std::set<Dataclass>& classes, const Dataclass& dataclass, bool isMember) {
        if (isMember) {
            classes.insert(dataclass);
        } else {
            classes.erase(dataclass);
        }
    }

    AccountIdentifier _identifier;
};

} // namespace nimbra::test
