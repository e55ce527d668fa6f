#pragma once

#include "device/files/DevicePaths.h"
#include "device/files/Folders.h"
#include "platform/values/Error.h"

#include <expected>
#include <string>

namespace nimbra::device {

// What the platform does with the files of the device that it is told of. Paths are the device's
// own, and errors name them so; a slash at the end of one says nothing. Any thread.

/// Removes the file called `devicePath`, or the folder with everything in it; of a link the link
/// itself. The device's root stays. The error is the errno, ENOENT where nothing stands there.
[[nodiscard]] std::expected<void, Error> removeItem(const DevicePaths& paths,
                                                    const std::string& devicePath);

/// Makes the folder called `devicePath`. The error is the errno.
[[nodiscard]] std::expected<void, Error>
createFolder(const DevicePaths& paths, const std::string& devicePath, const FolderMaking& making);

/// Where the file called `devicePath` is on this machine, its links followed: an absolute path, as
/// a program that is given another could take it for an option. The error is the errno.
[[nodiscard]] std::expected<std::string, int> placeOf(const DevicePaths& paths,
                                                      const std::string& devicePath);

} // namespace nimbra::device
