#pragma once

#include "device/files/DevicePaths.h"

#include <string>
#include <vector>

namespace nimbra::device {

/// Tells the value of an environment variable; null where it is not set.
using Environment = const char* (*)(const char* name);

/// The folders with the desktop entries of a device's applications, as the device names them, the
/// best first: its own one and, where it is this machine, before that those of the XDG base
/// directories that `environment` names.
[[nodiscard]] std::vector<std::string> applicationFolders(const DevicePaths& paths,
                                                          Environment environment);

/// The environment of this process.
[[nodiscard]] const char* processEnvironment(const char* name);

} // namespace nimbra::device
