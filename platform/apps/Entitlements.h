#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace nimbra {

struct EntitlementEntry;
struct EntitlementValue;

using EntitlementArray = std::vector<EntitlementValue>;
/// Keys and their values, in the order in which they were given.
using EntitlementDictionary = std::vector<EntitlementEntry>;

/// What an application is entitled to under one key, in the type in which it was granted: a
/// boolean is not a text that says "true".
struct EntitlementValue {
    std::variant<std::monostate, bool, std::int64_t, double, std::string, EntitlementArray,
                 EntitlementDictionary>
        value;

    /// Whether it is a number, booleans included, other than zero.
    [[nodiscard]] bool isTrueNumber() const;

    friend bool operator==(const EntitlementValue& left, const EntitlementValue& right);
};

struct EntitlementEntry {
    std::string key;
    EntitlementValue value;

    // NOLINTNEXTLINE(misc-no-recursion): values may be dictionaries in their turn
    friend bool operator==(const EntitlementEntry& left, const EntitlementEntry& right) = default;
};

/// What an application is entitled to.
using Entitlements = std::map<std::string, EntitlementValue, std::less<>>;

} // namespace nimbra
