#include "device/files/PlainFile.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <array>
#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>

namespace nimbra::device {

std::expected<PlainFile, Error> PlainFile::read(const std::string& path, std::size_t mostBytes,
                                                const std::string& name) {
    const auto failure = [&name] {
        return std::unexpected(fileError(name, "cannot be read", errno));
    };
    const auto refusal = [&name](const std::string& why) {
        return std::unexpected(deviceError(name + ": " + why));
    };
    // What is written from here on is marked with this tick or a later one.
    const auto tick = fileClockNow();
    struct stat status{};
    if (::lstat(path.c_str(), &status) != 0) {
        return failure();
    }
    // To open something else may already have an effect.
    if (!S_ISREG(status.st_mode)) {
        return refusal(S_ISDIR(status.st_mode) ? "is a directory" : "is not a plain file");
    }
    // Between the two calls a pipe may have taken the place.
    const Descriptor file(
        ::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    if (!file.isOpen() || ::fstat(file.number(), &status) != 0) {
        return failure();
    }
    if (!S_ISREG(status.st_mode)) {
        return refusal("is not a plain file");
    }
    PlainFile read{.content = {}, .version = {stampOf(status), tick}};
    std::array<char, 16384> buffer; // NOLINT(cppcoreguidelines-pro-type-member-init): filled below
    while (true) {
        const ssize_t count = ::read(file.number(), buffer.data(), buffer.size());
        if (count == 0) {
            return read;
        }
        if (count > 0) {
            read.content.append(buffer.data(), static_cast<std::size_t>(count));
        } else if (errno != EINTR) {
            return failure();
        }
        if (read.content.size() > mostBytes) {
            return refusal("is larger than " + std::to_string(mostBytes) + " bytes");
        }
    }
}

} // namespace nimbra::device
