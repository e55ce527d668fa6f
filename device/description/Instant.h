#pragma once

#include "platform/values/Date.h"

#include <optional>
#include <string>

namespace nimbra::device {

/// The instant that `text` names in the form of RFC 3339, to the microsecond; nothing for any
/// other text.
[[nodiscard]] std::optional<Date> parseInstant(const std::string& text);

} // namespace nimbra::device
