#pragma once

#include "device/DeviceDirectory.h"

#include <filesystem>
#include <optional>

namespace nimbra::host {

/// The directory of the running program's executable.
[[nodiscard]] std::filesystem::path executableDirectory();

/// The folder of the pane's bundle: the device's own, in the device directory `root`, where it has
/// one; else the one that came with this program. A folder that is not there is given back when
/// none is found, so that loading it says what is missing.
[[nodiscard]] std::filesystem::path findPaneBundle(const std::filesystem::path& root);

/// What came with this program to be put on devices; a path where nothing stands for what did not.
[[nodiscard]] device::DeviceParts findDeviceParts();

} // namespace nimbra::host
