#pragma once

#include "tools/mrctl/SecretPatterns.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// Adds the names of document files in `text` to `found`: with their blanks where they stand in
/// quotation marks, else from the first of the words with a capital that they end.
void findDocumentNames(std::string_view text, std::vector<FoundSecret>& found);

} // namespace nimbra::mrctl
