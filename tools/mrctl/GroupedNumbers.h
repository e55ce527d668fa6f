#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds to `found` the numbers in `text` that are written in groups: of telephones, cards and
/// accounts. A telephone's begins with "+", "(" or 0, or has groups of three, three and four digits
/// with "-" before the last. Dates, times and versions are none.
void findGroupedNumbers(std::string_view text, std::vector<FoundSecret>& found);

} // namespace nimbra::mrctl
