#pragma once

#include "device/DeviceDescription.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::host {

// Where a user's device is, and where it comes from.

/// Where programs keep what they remember: $XDG_STATE_HOME/nimbra, else ~/.local/state/nimbra.
[[nodiscard]] std::filesystem::path stateDirectory();

/// The device directory that is used when none is named.
[[nodiscard]] std::filesystem::path defaultDeviceDirectory();

/// The description of the sample device, which came with this program.
[[nodiscard]] std::filesystem::path sampleDescription();

/// Reads the description of a device from `file`, which may be a pipe. An error names the file and
/// the first place that is not as it should be.
[[nodiscard]] std::expected<device::GivenDescription, Error>
readDescription(const std::filesystem::path& file);

/// Sees to it that there is something at `root`: where nothing is, the sample device is made there.
/// What is there stays as it is. Gives back whether the device was made.
[[nodiscard]] std::expected<bool, Error> provideDevice(const std::filesystem::path& root);

} // namespace nimbra::host
