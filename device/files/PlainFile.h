#pragma once

#include "device/files/FileStamp.h"
#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
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

} // namespace nimbra::device
