#pragma once

#include "platform/apps/Entitlements.h"
#include "platform/values/Error.h"

#include <expected>
#include <string_view>

namespace nimbra::device {

/// The entitlements in `json`, an object, each in the type in which it stands there; a whole number
/// beyond 64 bits with a sign becomes a floating one. Anything else is an error: text that is not
/// JSON, a key that stands twice, values nested more than 100 deep.
[[nodiscard]] std::expected<Entitlements, Error> readEntitlements(std::string_view json);

} // namespace nimbra::device
