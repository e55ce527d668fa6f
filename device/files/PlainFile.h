#pragma once

#include "device/files/FileStamp.h"
#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
#include <filesystem>
#include <string>

namespace nimbra::device {

/// A regular file that was read.
struct PlainFile {
    std::string content;
    FileVersion version;

    /// Reads the file at `path`, unless it has more than `mostBytes`. A link, a pipe, a directory
    /// or a device is an error, and nothing waits for one. Messages call the file `name`.
    [[nodiscard]] static std::expected<PlainFile, Error>
    read(const std::string& path, std::size_t mostBytes, const std::string& name);
};

/// Nothing that is kept of a device's state in a file comes anywhere near it.
inline constexpr std::size_t kMostBytesOfFile = 16'000'000;

/// Everything in the regular file at `path`, or at the end of the links there, unless it has more
/// than `kMostBytesOfFile`. A pipe, a directory, a device or a socket is an error, and nothing
/// waits for one.
[[nodiscard]] std::expected<std::string, Error> readPlainFile(const std::filesystem::path& path);

} // namespace nimbra::device
