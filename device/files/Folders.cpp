#include "device/files/Folders.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>

namespace nimbra::device {

std::expected<std::filesystem::path, Error> makeFolder(const DevicePaths& paths,
                                                       std::string_view devicePath, mode_t mode) {
    auto folder = paths.resolve(devicePath);
    if (!folder) {
        return folder;
    }
    // By the root's descriptor: below a directory that has been removed nothing can be made.
    const Descriptor root(::open(paths.root().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
    if (!root.isOpen()) {
        return std::unexpected(fileError(*folder, "cannot be made", errno));
    }
    constexpr mode_t readableByEverybody = 0755;
    const std::filesystem::path below = folder->lexically_relative(paths.root());
    std::filesystem::path place;
    for (const std::filesystem::path& name : below) {
        place /= name;
        const mode_t wanted = place == below ? mode : readableByEverybody;
        if (::mkdirat(root.number(), place.c_str(), wanted) != 0 && errno != EEXIST) {
            return std::unexpected(fileError(*folder, "cannot be made", errno));
        }
    }
    return folder;
}

} // namespace nimbra::device
