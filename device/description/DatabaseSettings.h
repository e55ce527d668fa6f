#pragma once

#include "device/DeviceDescription.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <optional>

namespace nimbra::device {

/// Puts the settings bundle of the cloud database on the device: a copy of the bundle in the
/// folder `source`, with the number in its file app-groups.json. Without `settings` the bundle is
/// taken off the device. Each file is replaced as a whole, so that a process that has loaded the
/// bundle goes on with what it has; after an error some may have been.
[[nodiscard]] std::expected<void, Error>
replaceDatabaseSettings(const DevicePaths& paths,
                        const std::optional<DeviceDescription::DatabaseSettings>& settings,
                        const std::filesystem::path& source);

} // namespace nimbra::device
