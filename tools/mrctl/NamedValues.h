#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds to `found` all of `text` from the first value on that a name before it tells to be a
/// secret: where a value ends is its writer's affair, so that everything behind it goes, too. A
/// name is followed by "=", ":", an arrow or its tag's end; one of an option by a blank; a word for
/// a password by anything.
void findNamedValues(std::string_view text, std::vector<FoundSecret>& found);

} // namespace nimbra::mrctl
