#include "device/files/Folders.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <cerrno>
#include <fcntl.h>
#include <string>
#include <sys/stat.h>
#include <system_error>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

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

} // namespace

std::expected<void, Error> checkStateFolder(const DevicePaths& paths) {
    const auto state = paths.resolve(kStateDirectory);
    if (!state) {
        return std::unexpected(state.error());
    }
    std::error_code failure;
    switch (std::filesystem::status(*state, failure).type()) {
    case std::filesystem::file_type::directory:
        return {};
    case std::filesystem::file_type::none:
        return std::unexpected(fileError(*state, "cannot be read", failure.value()));
    default:
        return std::unexpected(deviceError(paths.root().string() +
                                           ": not a device directory: it has no folder " +
                                           std::string(kStateDirectory.substr(1))));
    }
}

int makeFolderAt(const DevicePaths& paths, const std::filesystem::path& place,
                 const FolderMaking& making) {
    std::vector<std::string> names = namesBelowRoot(paths, place);
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

std::expected<std::filesystem::path, Error> makeFolder(const DevicePaths& paths,
                                                       std::string_view devicePath,
                                                       std::optional<mode_t> permissions) {
    auto folder = paths.resolve(devicePath);
    if (!folder) {
        return folder;
    }
    const int failure =
        makeFolderAt(paths, *folder, {.makesParents = true, .permissions = permissions});
    if (failure != 0) {
        // What exists and will not do is no folder.
        return std::unexpected(
            fileError(*folder, "cannot be made", failure == EEXIST ? ENOTDIR : failure));
    }
    return folder;
}

std::expected<void, Error> removeFolder(const DevicePaths& paths, std::string_view devicePath) {
    const auto folder = paths.resolve(devicePath);
    if (!folder) {
        return std::unexpected(folder.error());
    }
    std::error_code failure;
    std::filesystem::remove_all(*folder, failure);
    if (failure) {
        return std::unexpected(fileError(*folder, "cannot be removed", failure.value()));
    }
    return {};
}

} // namespace nimbra::device
