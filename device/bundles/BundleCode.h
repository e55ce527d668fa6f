#pragma once

#include "platform/system/ClassRegistry.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>

namespace nimbra::device {

/// The classes that the shared object at `path` registers. It is loaded with dlopen and stays
/// loaded for the life of the process, since rows and classes point into it. An error, also one
/// that the object throws, names the file and what was expected of it. Main queue.
[[nodiscard]] std::expected<ClassRegistry, Error> classesIn(const std::filesystem::path& path);

} // namespace nimbra::device
