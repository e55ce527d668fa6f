#pragma once

#include "platform/accounts/Dataclass.h"
#include "platform/values/Identifier.h"

#include <map>
#include <optional>
#include <set>

namespace nimbra::device {

/// What the store keeps of an account.
struct AccountRecord {
    AccountIdentifier identifier;
    bool isPrimary = false;
    bool usesStratafile = false;
    /// The account of the cloud database, which the store need not hold.
    std::optional<AccountIdentifier> tessaryAccount;
    std::set<Dataclass> enabled;
    std::set<Dataclass> provisioned;
    std::set<Dataclass> cellular;
};

/// What was changed on an account: only this is written, so that two programs that change the same
/// account do not take back each other's changes.
struct AccountChanges {
    std::optional<bool> usesStratafile;
    std::map<Dataclass, bool> enabled;
    std::map<Dataclass, bool> cellular;

    friend bool operator==(const AccountChanges&, const AccountChanges&) = default;
};

} // namespace nimbra::device
