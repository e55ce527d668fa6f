#pragma once

#include "device/DeviceDescription.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::device {

/// Makes the device directory `root` from `description`. `root` must not exist or be empty;
/// directories above it are made. It is made beside its place and moved there when complete, so a
/// failure leaves nothing. `databaseBundle` is the folder of the cloud database's settings bundle,
/// of which a device with these settings gets a copy.
[[nodiscard]] std::expected<void, Error>
createDeviceDirectory(const std::filesystem::path& root, const DeviceDescription& description,
                      const std::filesystem::path& databaseBundle = {});

/// Replaces in the device directory `root` what the keys of `change` describe, whole values, as
/// another process would; everything else stays. `databaseBundle` is as above.
[[nodiscard]] std::expected<void, Error>
changeDeviceDirectory(const std::filesystem::path& root, const GivenDescription& change,
                      const std::filesystem::path& databaseBundle = {});

} // namespace nimbra::device
