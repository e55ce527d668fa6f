#pragma once

#include "device/documents/ProgressValues.h"
#include "platform/values/Error.h"

#include <cstddef>
#include <expected>
#include <string>
#include <string_view>

namespace nimbra::device {

/// The largest file of a progress that is read.
inline constexpr std::size_t kMostBytesOfProgressFile = 65536;

/// Whether a file of this name tells of a progress. Those that begin with a dot are on their way to
/// another name; a name with control characters could not be told of in a line.
[[nodiscard]] bool isProgressFileName(std::string_view name);

/// The progress that `text` tells of, a JSON object with the keys "fraction" (a number from 0 to
/// 1), "indeterminate" (a boolean), "description", "additional" and "fileOperationKind" (strings or
/// null); what is left out is 0, false or absent. The error, in one line, has the file, which it
/// calls `name`, the place, what was expected there and what was found.
[[nodiscard]] std::expected<ProgressValues, Error> parseProgressFile(std::string_view text,
                                                                     const std::string& name);

} // namespace nimbra::device
