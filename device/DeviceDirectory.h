#pragma once

#include "device/DeviceDescription.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::device {

/// What a device gets that is no part of its description.
struct DeviceParts {
    /// The program mrctl. Where it is not at hand, empty, a device that should have the real tool
    /// has none.
    std::filesystem::path tool;
    /// The folder of the cloud database's settings bundle, of which a device with these settings
    /// gets a copy.
    std::filesystem::path databaseBundle;
};

/// Makes the device directory `root` from `description`. `root` must not exist or be empty;
/// directories above it are made. It is built out of sight and put in its place when complete, as
/// `StagedDirectory` does it.
[[nodiscard]] std::expected<void, Error> createDeviceDirectory(const std::filesystem::path& root,
                                                               const DeviceDescription& description,
                                                               const DeviceParts& parts = {});

/// Replaces in the device directory `root` what the keys of `change` describe, whole values, as
/// another process would; everything else stays. What no file of the directory holds, such as the
/// planned faults, is left to whoever has a session. After an error in writing some of it may have
/// been replaced.
[[nodiscard]] std::expected<void, Error> changeDeviceDirectory(const std::filesystem::path& root,
                                                               const GivenDescription& change,
                                                               const DeviceParts& parts = {});

} // namespace nimbra::device
