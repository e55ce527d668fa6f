#pragma once

#include "tests/support/ProgramRun.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <string>
#include <sys/types.h>
#include <vector>

namespace nimbra::test {

/// The program under test, with a home and a directory for temporary files of its own.
class Program {
public:
    Program();

    /// Runs settingsctl with `arguments` to its end.
    [[nodiscard]] ProgramResult run(const std::vector<std::string>& arguments,
                                    const std::string& input = {}) const;
    /// Runs any other program the same way.
    [[nodiscard]] ProgramResult runOther(const std::vector<std::string>& command,
                                         const std::string& input = {}) const;

    /// Starts settingsctl with `arguments`, with its standard output at `output`.
    [[nodiscard]] pid_t start(const std::vector<std::string>& arguments, int output) const;

    /// The environment in which the program runs, as "NAME=VALUE".
    [[nodiscard]] std::vector<std::string> environment() const;

    /// A path in a directory that goes with this object.
    [[nodiscard]] std::filesystem::path path(const std::string& name) const;
    /// Makes the file `name` there.
    std::filesystem::path write(const std::string& name, const std::string& content) const;

    /// Makes a device without applications whose account has cloud documents on, in the directory
    /// `name` there; gives its path.
    [[nodiscard]] std::string makePlainDevice(const std::string& name) const;

    /// Whether no file and no directory is left where temporary ones are made.
    [[nodiscard]] bool leftNothingBehind() const;
    /// The device directory that is used when none is named.
    [[nodiscard]] std::filesystem::path defaultDevice() const;

private:
    TemporaryDirectory _directory;
};

/// The names and contents of all files below `directory`, to see whether any has changed.
[[nodiscard]] std::string contentsOf(const std::filesystem::path& directory);

/// The content of the file at `path`.
[[nodiscard]] std::string readWhole(const std::filesystem::path& path);

} // namespace nimbra::test
