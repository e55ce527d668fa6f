#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds to `found` what no word looks like: long runs in which letters, digits and capitals follow
/// each other in no order, hexadecimal and base64 texts, groups of as many characters each, long
/// numbers, addresses of the network, and what begins like a token of a well-known service. Dates,
/// versions, identifiers of applications and names of several words are none.
void findTokens(std::string_view text, std::vector<FoundSecret>& found);

} // namespace nimbra::mrctl
