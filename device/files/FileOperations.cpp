#include "device/files/FileOperations.h"

#include "device/DeviceError.h"

#include <cerrno>
#include <filesystem>
#include <system_error>
#include <utility>

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

} // namespace

std::expected<void, Error> removeItem(const DevicePaths& paths, const std::string& devicePath) {
    const auto failed = [&devicePath](int number) {
        return std::unexpected(fileError(devicePath, "cannot be removed", number));
    };
    const auto entry = entryCalled(paths, devicePath);
    if (!entry) {
        return failed(entry.error());
    }
    if (*entry == paths.root() / "") {
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
    if (const int failure = makeFolderAt(paths, *place, making); failure != 0) {
        return failed(failure);
    }
    return {};
}

std::expected<std::string, int> placeOf(const DevicePaths& paths, const std::string& devicePath) {
    const auto place = resolved(paths, devicePath);
    if (!place) {
        return std::unexpected(devicePath.empty() ? ENOENT : place.error());
    }
    std::error_code failure;
    const auto absolute = std::filesystem::absolute(*place, failure);
    if (failure) {
        return std::unexpected(failure.value());
    }
    return absolute.string();
}

} // namespace nimbra::device
