#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <optional>
#include <string_view>
#include <sys/types.h>

namespace nimbra::device {

// Folders of the device; any thread.

/// Whether what `paths` leads to is laid out as a device: it has the folder of a device's state.
/// The error says that it has none, or why that cannot be seen.
[[nodiscard]] std::expected<void, Error> checkStateFolder(const DevicePaths& paths);

/// How a folder is made.
struct FolderMaking {
    /// Whether folders that are missing above it are made, and one that stands there will do.
    bool makesParents = false;
    /// Those of a new folder, exactly; where none are given it is for everybody to read, as far as
    /// the process does not mask it.
    std::optional<mode_t> permissions;
};

/// Makes the folder at `place`, which `paths` has resolved. The device's root is never made: one
/// that has been removed does not come back. Gives 0, or the errno.
[[nodiscard]] int makeFolderAt(const DevicePaths& paths, const std::filesystem::path& place,
                               const FolderMaking& making);

/// Makes the folder that is called `devicePath` on the device, and those above it, where they are
/// missing, and gives back where it is; `permissions` as for `FolderMaking`.
[[nodiscard]] std::expected<std::filesystem::path, Error>
makeFolder(const DevicePaths& paths, std::string_view devicePath,
           std::optional<mode_t> permissions = std::nullopt);

/// Removes the folder that is called `devicePath` on the device, with everything in it. One that is
/// not there is no error.
[[nodiscard]] std::expected<void, Error> removeFolder(const DevicePaths& paths,
                                                      std::string_view devicePath);

} // namespace nimbra::device
