#pragma once

#include <array>
#include <string>
#include <sys/types.h>
#include <vector>

namespace nimbra::test {

/// What a program left behind when it ended.
struct ProgramResult {
    /// Its exit status; minus the signal's number where a signal ended it.
    int status = 0;
    std::string output;
    std::string messages;
};

/// Starts `command`, looked for as a shell does, in `environment` ("NAME=VALUE"), with its three
/// standard files opened on `files`; one below 0 is closed.
[[nodiscard]] pid_t startProgram(std::vector<std::string> command,
                                 std::vector<std::string> environment,
                                 const std::array<int, 3>& files);

/// Runs `command` to its end, with `input` as its standard input.
[[nodiscard]] ProgramResult runProgram(const std::vector<std::string>& command,
                                       const std::vector<std::string>& environment,
                                       const std::string& input = {});

/// The exit status in what waitpid said, or minus the signal's number.
[[nodiscard]] int exitStatusOf(int waited);

} // namespace nimbra::test
