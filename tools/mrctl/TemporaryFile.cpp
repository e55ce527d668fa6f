#include "tools/mrctl/TemporaryFile.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"

#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <fcntl.h>
#include <memory>
#include <random>
#include <string_view>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace nimbra::mrctl {

namespace {

using device::Descriptor;

constexpr mode_t onlyForOwner = 0600;
constexpr mode_t everyNewFile = 0666;

constexpr std::string_view digits = "0123456789abcdef";
constexpr std::size_t digitsOfName = 16;

std::string randomName(const std::string& prefix) {
    std::random_device random;
    std::string name = prefix;
    for (std::size_t count = 0; count < digitsOfName; ++count) {
        name += digits[random() % digits.size()];
    }
    return name;
}

/// Whether `name` is one that `randomName` makes: the user's own files may begin like these.
bool isRandomName(std::string_view name, std::string_view prefix) {
    return name.size() == prefix.size() + digitsOfName && name.starts_with(prefix) &&
           name.find_first_not_of(digits, prefix.size()) == std::string_view::npos;
}

/// What the process takes away from the permissions of each new file.
mode_t permissionsTakenAway() {
    const mode_t mask = ::umask(everyNewFile & ~onlyForOwner);
    ::umask(mask);
    return mask;
}

/// An archive takes the place of a plain file or of nothing: to replace a link, a pipe or a device
/// is never what somebody wants who gives its name.
std::expected<void, Error> checkPlace(const std::filesystem::path& target) {
    struct stat status{};
    if (::lstat(target.c_str(), &status) != 0 || S_ISREG(status.st_mode)) {
        return {};
    }
    if (S_ISDIR(status.st_mode)) {
        return std::unexpected(device::fileError(target, "cannot be written", EISDIR));
    }
    return std::unexpected(
        device::deviceError(target.string() + ": cannot be written: is not a plain file"));
}

/// Whether the file at `descriptor` has still a name.
bool hasName(int descriptor) {
    struct stat status{};
    return ::fstat(descriptor, &status) == 0 && status.st_nlink > 0;
}

} // namespace

std::expected<TemporaryFile, Error> TemporaryFile::make(const std::filesystem::path& target,
                                                        const std::string& prefix) {
    if (auto checked = checkPlace(target); !checked) {
        return std::unexpected(std::move(checked.error()));
    }
    const auto parent = target.parent_path();
    Descriptor directory(
        ::open(parent.empty() ? "." : parent.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!directory.isOpen()) {
        return std::unexpected(device::fileError(target, "cannot be written", errno));
    }
    TemporaryFile file(target, std::move(directory));
    file.removeLeftovers(prefix);
    if (!file.create(prefix)) {
        return std::unexpected(device::fileError(target, "cannot be written", errno));
    }
    return file;
}

TemporaryFile::TemporaryFile(std::filesystem::path target, Descriptor directory)
    : _target(std::move(target)), _directory(std::move(directory)) {}

TemporaryFile::TemporaryFile(TemporaryFile&& other) noexcept
    : _target(std::move(other._target)), _directory(std::move(other._directory)),
      _file(std::move(other._file)), _name(std::exchange(other._name, {})) {}

TemporaryFile::~TemporaryFile() {
    if (!_name.empty()) {
        ::unlinkat(_directory.number(), _name.c_str(), 0);
    }
}

bool TemporaryFile::create(const std::string& prefix) {
    while (true) {
        const std::string name = randomName(prefix);
        const int number = ::openat(_directory.number(), name.c_str(),
                                    O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, onlyForOwner);
        if (number < 0 && errno == EEXIST) {
            continue;
        }
        // Another program may have taken it for a leftover before it was locked.
        if (number >= 0 && (::flock(number, LOCK_EX | LOCK_NB) != 0 || !hasName(number))) {
            ::close(number);
            continue;
        }
        if (number < 0) {
            return false;
        }
        std::destroy_at(&_file);
        std::construct_at(&_file, number);
        _name = name;
        return true;
    }
}

void TemporaryFile::removeLeftovers(const std::string& prefix) const {
    const auto parent = _target.parent_path();
    const auto entries = device::entriesOfDirectory(parent.empty() ? "." : parent);
    if (!entries) {
        return; // whoever cannot look cannot clean up, and can write all the same
    }
    for (const std::filesystem::path& entry : *entries) {
        const std::string name = entry.filename();
        if (!isRandomName(name, prefix)) {
            continue;
        }
        const Descriptor file(::openat(_directory.number(), name.c_str(),
                                       O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
        struct stat status{};
        if (file.isOpen() && ::fstat(file.number(), &status) == 0 && S_ISREG(status.st_mode) &&
            status.st_uid == ::geteuid() && ::flock(file.number(), LOCK_EX | LOCK_NB) == 0) {
            ::unlinkat(_directory.number(), name.c_str(), 0);
        }
    }
}

std::expected<void, Error> TemporaryFile::putInPlace() {
    const auto failure = [this] {
        return std::unexpected(device::fileError(_target, "cannot be written", errno));
    };
    if (auto checked = checkPlace(_target); !checked) {
        return checked;
    }
    if (::fchmod(_file.number(), everyNewFile & ~permissionsTakenAway()) != 0 ||
        ::fsync(_file.number()) != 0 ||
        ::renameat(_directory.number(), _name.c_str(), _directory.number(),
                   _target.filename().c_str()) != 0) {
        return failure();
    }
    // From here on it is the file in place that has to go when it cannot be kept.
    _name = _target.filename();
    if (::fsync(_directory.number()) != 0) {
        return failure();
    }
    _name.clear();
    return {};
}

} // namespace nimbra::mrctl
