#include "device/documents/PriorityHints.h"

#include "device/DeviceError.h"
#include "device/files/Folders.h"
#include "device/files/PercentEncoding.h"

#include <cerrno>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

PriorityHints::PriorityHints(DevicePaths paths) : _paths(std::move(paths)) {}

std::string PriorityHints::directory() {
    return std::string(kPriorityHintsDirectory) + '/' + std::to_string(::getpid());
}

std::expected<void, Error> PriorityHints::add(const std::string& container) const {
    const auto folder = makeFolder(_paths, directory());
    if (!folder) {
        return std::unexpected(_paths.asTheDeviceSaysIt(folder.error()));
    }
    const std::filesystem::path hint = *folder / percentEncoded(container);
    constexpr mode_t readableByEverybody = 0644;
    const int file = ::open(hint.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, readableByEverybody);
    if (file < 0) {
        return std::unexpected(_paths.asTheDeviceSaysIt(fileError(hint, "cannot be made", errno)));
    }
    ::close(file);
    return {};
}

std::expected<void, Error> PriorityHints::removeAll() const {
    auto removed = removeFolder(_paths, directory());
    if (!removed) {
        return std::unexpected(_paths.asTheDeviceSaysIt(std::move(removed.error())));
    }
    return removed;
}

} // namespace nimbra::device
