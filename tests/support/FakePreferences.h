#pragma once

#include "platform/system/Preferences.h"

#include <map>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

class FakePreferences final : public Preferences {
public:
    [[nodiscard]] std::optional<std::int64_t>
    appIntegerValueForKeyInDomain(const std::string& key,
                                  const std::string& domain) const override {
        reads.emplace_back(domain, key);
        const auto value = integers.find({domain, key});
        return value != integers.end() ? std::optional(value->second) : std::nullopt;
    }

    /// By domain and key.
    std::map<std::pair<std::string, std::string>, std::int64_t> integers;
    /// What was asked for, in order, each by domain and key.
    mutable std::vector<std::pair<std::string, std::string>> reads;
};

} // namespace nimbra::test
