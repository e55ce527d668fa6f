#pragma once

#include <filesystem>
#include <optional>

namespace nimbra::host {

/// The directory of the running program's executable.
[[nodiscard]] std::filesystem::path executableDirectory();

/// The folder of the pane's bundle: the device's own, in the device directory `root`, where it has
/// one; else the one that came with this program. A folder that is not there is given back when
/// none is found, so that loading it says what is missing.
[[nodiscard]] std::filesystem::path findPaneBundle(const std::filesystem::path& root);

/// The folder of the settings bundle of the cloud database that came with this program, to be put
/// on a device; a folder that is not there when none is found.
[[nodiscard]] std::filesystem::path findDatabaseBundle();

} // namespace nimbra::host
