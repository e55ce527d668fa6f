#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <optional>
#include <string>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// Whether every file of preferences on the device can be read.
[[nodiscard]] std::expected<void, Error> checkPreferences(const DevicePaths& paths);

/// The preferences of applications, by domain and key, as their files have them now. Any thread.
class DevicePreferences {
public:
    /// `log` is told of what cannot be read and outlives the preferences.
    DevicePreferences(DevicePaths paths, SystemLog& log);

    /// The integer under `key` of `domain`; nothing where there is none, or something else.
    [[nodiscard]] std::optional<std::int64_t> integer(const std::string& domain,
                                                      const std::string& key) const;

private:
    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
