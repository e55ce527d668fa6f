#pragma once

#include "device/files/DevicePaths.h"
#include "platform/system/Preferences.h"
#include "platform/values/Error.h"

#include <cstdint>
#include <expected>
#include <optional>
#include <string>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// Whether every file of preferences on the device can be read; the error names the first that
/// cannot.
[[nodiscard]] std::expected<void, Error> checkPreferences(const DevicePaths& paths);

/// The preferences of applications as their files have them now. What cannot be read is nothing,
/// with a line in the log. Any thread.
class DevicePreferences final : public Preferences {
public:
    /// `log` is told of what cannot be read and outlives the preferences.
    DevicePreferences(DevicePaths paths, SystemLog& log);

    [[nodiscard]] std::optional<std::int64_t>
    appIntegerValueForKeyInDomain(const std::string& key, const std::string& domain) const override;

private:
    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
