#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string_view>
#include <sys/types.h>

namespace nimbra::device {

/// Makes the folder that is called `devicePath` on the device, and those above it, where they are
/// missing; a new one has `mode`, those above it are for everybody to read. Gives back where it is.
/// The device's root is never made: one that has been removed does not come back. Any thread.
[[nodiscard]] std::expected<std::filesystem::path, Error>
makeFolder(const DevicePaths& paths, std::string_view devicePath, mode_t mode);

} // namespace nimbra::device
