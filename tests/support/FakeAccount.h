#pragma once

#include "platform/accounts/Account.h"

#include <set>
#include <string>
#include <utility>

namespace nimbra::test {

/// An account that a test fills as it needs it.
class FakeAccount final : public Account {
public:
    explicit FakeAccount(std::string identifier) : _identifier(std::move(identifier)) {}

    [[nodiscard]] const AccountIdentifier& identifier() const override { return _identifier; }
    [[nodiscard]] bool isEnabledForDataclass(const Dataclass& dataclass) const override {
        return enabled.contains(dataclass);
    }
    void setEnabledForDataclass(bool value, const Dataclass& dataclass) override {
        if (value) {
            enabled.insert(dataclass);
        } else {
            enabled.erase(dataclass);
        }
    }
    [[nodiscard]] bool vt_isUsingStratafile() const override { return usesStratafile; }

    std::set<Dataclass> enabled;
    bool usesStratafile = true;

private:
    AccountIdentifier _identifier;
};

} // namespace nimbra::test
