#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds to `found` the addresses of the network in `text`, with the zone of each: those of network
/// cards, of four numbers with dots and of groups with colons. Times, versions and names with
/// colons in them are none; of four numbers, the first of which has one digit, only those with a
/// port are no version.
void findNetworkAddresses(std::string_view text, std::vector<FoundSecret>& found);

} // namespace nimbra::mrctl
