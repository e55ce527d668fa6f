#pragma once

#include <chrono>
#include <optional>
#include <string>

namespace nimbra::device {

/// The instant that `text` names in the form of RFC 3339, to the microsecond; nothing for any
/// other text.
[[nodiscard]] std::optional<std::chrono::system_clock::time_point>
parseInstant(const std::string& text);

} // namespace nimbra::device
