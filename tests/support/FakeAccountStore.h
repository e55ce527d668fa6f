#pragma once

#include "platform/accounts/AccountStore.h"
#include "tests/support/FakeAccount.h"

#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

/// A store with at most one account, "primary", of which every question gives a fresh copy.
class FakeAccountStore final : public AccountStore {
public:
    [[nodiscard]] std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) override {
        asked.push_back(identifier.string());
        if (!isReadable || identifier.string() != "primary") {
            return nullptr;
        }
        auto account = std::make_shared<FakeAccount>("primary");
        account->enabled = stored.enabled;
        account->usesStratafile = stored.usesStratafile;
        return account;
    }

    /// What the store holds.
    FakeAccount stored{"primary"};
    bool isReadable = true;
    /// The identifiers asked for, in order.
    std::vector<std::string> asked;
};

} // namespace nimbra::test
