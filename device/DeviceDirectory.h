#pragma once

#include "device/DeviceDescription.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::device {

/// Makes the device directory `root` from `description`. `root` must not exist or be empty;
/// directories above it are made. It is made beside its place and moved there when complete, so a
/// failure leaves nothing.
[[nodiscard]] std::expected<void, Error>
createDeviceDirectory(const std::filesystem::path& root, const DeviceDescription& description);

/// Replaces in the device directory `root` what the keys of `change` describe, whole values, as
/// another process would; everything else stays.
[[nodiscard]] std::expected<void, Error> changeDeviceDirectory(const std::filesystem::path& root,
                                                               const GivenDescription& change);

} // namespace nimbra::device
