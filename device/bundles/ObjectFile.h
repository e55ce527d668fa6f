#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string>

namespace nimbra::device {

/// Whether the linker may be given the file at `path`, or at the end of the links there. It maps
/// what the file's header promises and does not look whether that much is there: to use what lies
/// behind the end would kill the process. An error, for which `what` stands behind the path, is a
/// file that is cut off, is no plain file or cannot be read. What is no shared object of this
/// machine at all is none here: the linker finds that itself. Any thread.
[[nodiscard]] std::expected<void, Error> checkObjectFile(const std::filesystem::path& path,
                                                         const std::string& what);

} // namespace nimbra::device
