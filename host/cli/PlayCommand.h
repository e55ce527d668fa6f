#pragma once

#include "host/cli/Failure.h"

#include <expected>
#include <filesystem>
#include <iosfwd>
#include <optional>
#include <string>

namespace nimbra::cli {

/// What is played, and how.
struct PlayOptions {
    /// The scenario's file; "-" for standard input.
    std::string scenario;
    /// Where the device directory stays behind; nothing for a temporary one.
    std::optional<std::filesystem::path> keep;
    std::optional<std::filesystem::path> bundle;
    std::optional<std::string> locale;
};

/// Plays a scenario on a device directory made for it: the trace goes to `out`. Nothing else stays
/// behind, also when the program is interrupted.
[[nodiscard]] std::expected<void, Failure> play(const PlayOptions& options, std::ostream& out);

} // namespace nimbra::cli
