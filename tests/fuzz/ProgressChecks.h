#pragma once

#include <string>
#include <string_view>

namespace nimbra::test {

/// Reads `text` as the file of a progress. Gives what does not hold of what was read, however bad
/// it is, in a sentence; an empty one when all does.
[[nodiscard]] std::string faultInProgressFile(std::string_view text);

} // namespace nimbra::test
