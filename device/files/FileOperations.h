#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <optional>
#include <string>
#include <sys/types.h>

namespace nimbra::device {

// What the platform does with the files of the device that it is told of. Paths are the device's
// own, and errors name them so; a slash at the end of one says nothing. Any thread.

/// Removes the file called `devicePath`, or the folder with everything in it; of a link the link
/// itself. The device's root stays. The error is the errno, ENOENT where nothing stands there.
[[nodiscard]] std::expected<void, Error> removeItem(const DevicePaths& paths,
                                                    const std::string& devicePath);

struct FolderMaking {
    /// Whether folders that are missing above it are made, and one that stands there will do.
    bool makesParents = false;
    /// Those of a new folder, exactly; where none are given it is for everybody to read, as far as
    /// the process does not mask it.
    std::optional<mode_t> permissions;
};

/// Makes the folder called `devicePath`. The error is the errno.
[[nodiscard]] std::expected<void, Error>
createFolder(const DevicePaths& paths, const std::string& devicePath, const FolderMaking& making);

/// Where the file called `devicePath` is, its links followed; nothing for a path that no file
/// system knows, or whose links lead round in a circle.
[[nodiscard]] std::optional<std::filesystem::path> placeOf(const DevicePaths& paths,
                                                           const std::string& devicePath);

} // namespace nimbra::device
