#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <string>

namespace nimbra::host {

class PaneSession;

/// Whether the device of `session` has an account with this identifier. An error names those that
/// it has. Main queue.
[[nodiscard]] std::expected<void, Error> checkAccount(PaneSession& session,
                                                      const std::string& account);

} // namespace nimbra::host
