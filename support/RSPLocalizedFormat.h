#pragma once

#include "platform/system/Localization.h"
#include "platform/values/Text.h"

#include <initializer_list>
#include <memory>

namespace nimbra {

class Bundle;

/// The text under `key`, looked up with `RSPLocalizedString`, with its placeholders filled from
/// `arguments` by the user's current locale. A missing key gives the lookup's own stand-in, a
/// missing bundle an absent text; the arguments are then ignored. Any queue.
[[nodiscard]] Text RSPLocalizedFormat(const Text& key, const Text& table,
                                      const std::shared_ptr<Bundle>& bundle,
                                      const Localization& localization,
                                      std::initializer_list<FormatArgument> arguments);

} // namespace nimbra
