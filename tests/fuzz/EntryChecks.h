#pragma once

#include "platform/apps/Entitlements.h"

#include <string>
#include <string_view>

namespace nimbra::test {

// What holds of whatever is read, however bad it is. Each gives what does not hold, in a sentence;
// an empty one when all does.

/// Reads `text` as a desktop entry, for users of several languages.
[[nodiscard]] std::string faultInEntry(std::string_view text);

/// Reads `json` as the entitlements of an application.
[[nodiscard]] std::string faultInEntitlements(std::string_view json);

} // namespace nimbra::test
