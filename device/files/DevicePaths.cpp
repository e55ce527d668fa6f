#include "device/files/DevicePaths.h"

#include "device/DeviceError.h"

#include <cerrno>
#include <deque>
#include <string>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

// As many links as the kernel follows in one path.
constexpr int mostLinks = 40;

void putInFront(std::deque<std::string>& names, const std::filesystem::path& path) {
    auto place = names.begin();
    for (const std::filesystem::path& name : path.relative_path()) {
        place = std::next(names.insert(place, name.string()));
    }
}

} // namespace

DevicePaths::DevicePaths(std::filesystem::path root) : _root(std::move(root)) {}

std::expected<std::filesystem::path, Error>
DevicePaths::resolve(std::string_view devicePath) const {
    std::deque<std::string> names;
    putInFront(names, devicePath);
    std::filesystem::path below; // the part resolved so far, relative to the root
    int links = 0;
    while (!names.empty()) {
        const std::string name = std::move(names.front());
        names.pop_front();
        if (name.empty() || name == ".") {
            continue;
        }
        if (name == "..") {
            below = below.parent_path();
            continue;
        }
        std::error_code notALink;
        const auto target = std::filesystem::read_symlink(_root / below / name, notALink);
        if (notALink) {
            below /= name;
            continue;
        }
        if (++links > mostLinks) {
            return std::unexpected(fileError(_root / below / name, "cannot be followed", ELOOP));
        }
        if (target.is_absolute()) {
            below.clear();
        }
        putInFront(names, target);
    }
    return _root / below;
}

Error DevicePaths::asTheDeviceSaysIt(Error error) const {
    return _root.empty() ? error : withPath(std::move(error), _root / "", "/");
}

} // namespace nimbra::device
