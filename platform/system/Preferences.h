#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace nimbra {

/// The preferences that applications keep. Any queue.
class Preferences {
public:
    virtual ~Preferences() = default;

    /// The integer under `key` of the application `domain`, as it stands now; nothing where the key
    /// does not exist or holds no valid integer, and where the preferences cannot be read, which is
    /// logged.
    [[nodiscard]] virtual std::optional<std::int64_t>
    appIntegerValueForKeyInDomain(const std::string& key, const std::string& domain) const = 0;
};

} // namespace nimbra
