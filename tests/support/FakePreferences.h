#pragma once

#include "platform/system/Preferences.h"

#include <map>
#include <string>
#include <utility>

namespace nimbra::test {

class FakePreferences final : public Preferences {
public:
    [[nodiscard]] std::optional<std::int64_t>
    appIntegerValueForKeyInDomain(const std::string& key,
                                  const std::string& domain) const override {
        const auto value = integers.find({domain, key});
        return value != integers.end() ? std::optional(value->second) : std::nullopt;
    }

    /// By domain and key.
    std::map<std::pair<std::string, std::string>, std::int64_t> integers;
};

} // namespace nimbra::test
