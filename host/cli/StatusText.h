#pragma once

#include "host/core/FooterDescription.h"

#include <string>

namespace nimbra::cli {

/// A status footer in words: how far the sync has come, where a bar shows that, and what stands
/// under the bar ("45 %  Uploading 3 items"). Empty where there is nothing to say.
[[nodiscard]] std::string statusText(const host::FooterDescription& footer);

/// The same in one line of at most `width` columns, with a bar that is drawn.
[[nodiscard]] std::string statusLine(const host::FooterDescription& footer, std::size_t width);

} // namespace nimbra::cli
