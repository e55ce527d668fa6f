#include "device/files/PlainFile.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <array>
#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <utility>

namespace nimbra::device {

namespace {

enum class Links { refused, followed };

std::expected<PlainFile, Error> readRegular(const std::string& path, std::size_t mostBytes,
                                            const std::string& name, Links links) {
    const auto failure = [&name] {
        return std::unexpected(fileError(name, "cannot be read", errno));
    };
    const auto refusal = [&name](const std::string& why) {
        return std::unexpected(deviceError(name + ": " + why));
    };
    // What is written from here on is marked with this tick or a later one.
    const auto tick = fileClockNow();
    struct stat status{};
    if ((links == Links::refused ? ::lstat(path.c_str(), &status)
                                 : ::stat(path.c_str(), &status)) != 0) {
        return failure();
    }
    // To open something else may already have an effect.
    if (!S_ISREG(status.st_mode)) {
        return refusal(S_ISDIR(status.st_mode) ? "is a directory" : "is not a plain file");
    }
    // Between the two calls a pipe may have taken the place.
    const int noLink = links == Links::refused ? O_NOFOLLOW : 0;
    const Descriptor file(
        ::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC | noLink));
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

} // namespace

std::expected<PlainFile, Error> PlainFile::read(const std::string& path, std::size_t mostBytes,
                                                const std::string& name) {
    return readRegular(path, mostBytes, name, Links::refused);
}

std::expected<std::string, Error> readPlainFile(const std::filesystem::path& path) {
    auto file = readRegular(path.string(), kMostBytesOfFile, path.string(), Links::followed);
    if (!file) {
        return std::unexpected(std::move(file.error()));
    }
    return std::move(file->content);
}

} // namespace nimbra::device
