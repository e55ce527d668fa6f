#pragma once

#include <string>
#include <vector>

namespace nimbra::test {

/// What a program said and how it ended.
struct CommandResult {
    /// The exit status as a shell gives it.
    int status = 0;
    /// Both outputs, in the order in which they came.
    std::string output;
};

/// Runs `argv`, found on the path, without standard input, and waits for its end.
[[nodiscard]] CommandResult run(const std::vector<std::string>& argv);

} // namespace nimbra::test
