#include "device/files/FileOperations.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <system_error>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

using Place = std::expected<std::filesystem::path, int>;

bool isName(const std::string& devicePath) {
    return !devicePath.empty() && !devicePath.contains('\0');
}

Place resolved(const DevicePaths& paths, const std::string& devicePath) {
    if (!isName(devicePath)) {
        return std::unexpected(EINVAL);
    }
    auto place = paths.resolve(devicePath);
    if (!place) {
        return std::unexpected(place.error().code);
    }
    return std::move(*place);
}

/// Where the entry called `devicePath` is, also where that is a link; the device's root for "/".
Place entryCalled(const DevicePaths& paths, const std::string& devicePath) {
    const auto end = devicePath.find_last_not_of('/');
    if (end == std::string::npos || !isName(devicePath)) {
        return resolved(paths, devicePath);
    }
    const auto start = devicePath.find_last_of('/', end) + 1;
    const std::string name = devicePath.substr(start, end + 1 - start);
    if (name == "." || name == "..") {
        return std::unexpected(EINVAL);
    }
    const auto parent = resolved(paths, '/' + devicePath.substr(0, start));
    return parent ? Place(*parent / name) : parent;
}

std::vector<std::string> namesBelowRoot(const DevicePaths& paths,
                                        const std::filesystem::path& place) {
    std::vector<std::string> names;
    for (const std::filesystem::path& name : place.lexically_relative(paths.root())) {
        if (!name.empty() && name != ".") {
            names.push_back(name);
        }
    }
    return names;
}

/// The folder `name` in `folder`, for no more than being named by it. A link is none: links have
/// been followed, one that stands here now has come in between.
Descriptor openFolder(const Descriptor& folder, const std::string& name) {
    return Descriptor(
        ::openat(folder.number(), name.c_str(), O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
}

int madeAt(const Descriptor& parent, const std::string& name, const FolderMaking& making) {
    constexpr mode_t readableByEverybody = 0755;
    constexpr mode_t readableByOwner = 0700;
    // Exact permissions come afterwards, and nobody shall have more until then.
    const mode_t first = making.permissions ? readableByOwner : readableByEverybody;
    if (::mkdirat(parent.number(), name.c_str(), first) != 0) {
        const int failure = errno;
        const bool willDo = failure == EEXIST && making.makesParents;
        return willDo && openFolder(parent, name).isOpen() ? 0 : failure;
    }
    if (!making.permissions) {
        return 0;
    }
    const Descriptor made = openFolder(parent, name);
    if (!made.isOpen()) {
        return errno;
    }
    // By its descriptor, and that without opening it for reading, which a mask may forbid.
    const std::string place = "/proc/self/fd/" + std::to_string(made.number());
    return ::chmod(place.c_str(), *making.permissions & 07777U) == 0 ? 0 : errno;
}

/// Makes the folder that `names` lead to from the device's root; 0 or an errno.
int madeBelowRoot(const DevicePaths& paths, std::vector<std::string> names,
                  const FolderMaking& making) {
    if (names.empty()) {
        return making.makesParents ? 0 : EEXIST;
    }
    const std::string last = std::move(names.back());
    names.pop_back();
    // Below a root that has been removed nothing can be made.
    std::optional<Descriptor> folder(
        std::in_place, ::open(paths.root().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
    if (!folder->isOpen()) {
        return errno;
    }
    for (const std::string& name : names) {
        if (making.makesParents) {
            if (const int failure = madeAt(*folder, name, {.makesParents = true}); failure != 0) {
                return failure;
            }
        }
        Descriptor next = openFolder(*folder, name);
        if (!next.isOpen()) {
            return errno;
        }
        folder.emplace(std::move(next));
    }
    return madeAt(*folder, last, making);
}

} // namespace

std::expected<void, Error> removeItem(const DevicePaths& paths, const std::string& devicePath) {
    const auto failed = [&devicePath](int number) {
        return std::unexpected(fileError(devicePath, "cannot be removed", number));
    };
    const auto entry = entryCalled(paths, devicePath);
    if (!entry) {
        return failed(entry.error());
    }
    if (namesBelowRoot(paths, *entry).empty()) {
        return failed(EBUSY);
    }
    std::error_code failure;
    const auto count = std::filesystem::remove_all(*entry, failure);
    // Below a file nothing stands.
    if (failure && failure != std::errc::not_a_directory) {
        return failed(failure.value());
    }
    return failure || count == 0 ? failed(ENOENT) : std::expected<void, Error>();
}

std::expected<void, Error> createFolder(const DevicePaths& paths, const std::string& devicePath,
                                        const FolderMaking& making) {
    const auto failed = [&devicePath](int number) {
        return std::unexpected(fileError(devicePath, "cannot be made", number));
    };
    const auto place =
        making.makesParents ? resolved(paths, devicePath) : entryCalled(paths, devicePath);
    if (!place) {
        return failed(place.error());
    }
    if (const int failure = madeBelowRoot(paths, namesBelowRoot(paths, *place), making);
        failure != 0) {
        return failed(failure);
    }
    return {};
}

std::optional<std::filesystem::path> placeOf(const DevicePaths& paths,
                                             const std::string& devicePath) {
    auto place = resolved(paths, devicePath);
    return place ? std::optional(std::move(*place)) : std::nullopt;
}

} // namespace nimbra::device
