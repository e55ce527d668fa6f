#pragma once

#include "platform/values/Date.h"

#include <optional>
#include <string_view>

namespace nimbra::device {

/// The instant that `text` names in the form of RFC 3339, to the microsecond; nothing for any
/// other text.
[[nodiscard]] std::optional<Date> parseInstant(std::string_view text);

} // namespace nimbra::device
