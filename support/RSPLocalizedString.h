#pragma once

#include "platform/values/Text.h"

#include <memory>

namespace nimbra {

class Bundle;

/// The text under `key` in the string table `table` of `bundle`, in the user's language.
///
/// A key that no table has gives the text "RSP_LOCALIZED_STRING_UNAVAILABLE", which the user sees
/// in its place, and writes one line to `syslog`, each time. Without a bundle the result is absent
/// and nothing is written. Any queue.
[[nodiscard]] Text RSPLocalizedString(const Text& key, const Text& table,
                                      const std::shared_ptr<Bundle>& bundle);

} // namespace nimbra
