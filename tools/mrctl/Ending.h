#pragma once

#include <functional>
#include <iosfwd>

namespace nimbra::mrctl {

/// Runs `program` and gives its exit status. What it throws, as where there is not enough memory,
/// is one line in `messages` and `exitFailed`; what it has begun has been cleared away by then.
/// Where not even that can be done for lack of memory, the process ends at once with the same
/// status, and the line on standard error.
[[nodiscard]] int exitStatusOf(const std::function<int()>& program, std::ostream& messages);

} // namespace nimbra::mrctl
