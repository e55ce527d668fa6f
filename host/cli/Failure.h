#pragma once

#include <string>

namespace nimbra::cli {

// What the program tells its caller when it ends.

/// All was done.
inline constexpr int exitDone = 0;
/// What was asked for cannot be done here: no such row, a locked switch.
inline constexpr int exitRefused = 1;
/// The question itself is wrong: an unknown option, a file that cannot be read.
inline constexpr int exitBadInput = 2;

/// Why a command was not done, in one line to be read behind the program's name.
struct Failure {
    int exitStatus;
    std::string message;
};

} // namespace nimbra::cli
