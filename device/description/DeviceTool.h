#pragma once

#include "device/DeviceDescription.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::device {

/// Puts a script that does what `tool` says in the place of the device's command-line tool; for a
/// missing one it takes away what stands there. The real tool is the program `real`, which is told
/// of the device that the script stands on; it may be empty, and then it is a missing one.
[[nodiscard]] std::expected<void, Error> replaceTool(const DevicePaths& paths,
                                                     const DeviceDescription::Tool& tool,
                                                     const std::filesystem::path& real);

} // namespace nimbra::device
