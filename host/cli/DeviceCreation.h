#pragma once

#include "host/cli/Failure.h"

#include <expected>
#include <filesystem>
#include <iosfwd>
#include <optional>

namespace nimbra::cli {

/// Sees to it that there is something at `root`: where nothing is, the sample device is made there
/// and `messages` says so in one line. What is there stays as it is.
[[nodiscard]] std::expected<void, Failure> provideDevice(const std::filesystem::path& root,
                                                         std::ostream& messages);

/// Makes a device directory at `root`, which must not exist or be empty, from the description in
/// the file `from`, or else from the sample; says on `out` what was made, and on `messages` what
/// of the description has no effect.
[[nodiscard]] std::expected<void, Failure>
initializeDevice(const std::filesystem::path& root,
                 const std::optional<std::filesystem::path>& from, std::ostream& out,
                 std::ostream& messages);

} // namespace nimbra::cli
