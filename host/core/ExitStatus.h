#pragma once

namespace nimbra::host {

// What a host's program tells its caller when it ends.

/// All was done.
inline constexpr int exitDone = 0;
/// What was asked for cannot be done here: no such row, a locked switch.
inline constexpr int exitRefused = 1;
/// The question itself is wrong: an unknown option, a file that cannot be read.
inline constexpr int exitBadInput = 2;

} // namespace nimbra::host
