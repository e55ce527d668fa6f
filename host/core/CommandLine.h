#pragma once

#include "device/DeviceError.h"
#include "host/core/ExitStatus.h"

#include <expected>
#include <iostream>
#include <string>

namespace nimbra::host {

// What the command lines of the hosts have in common, whatever library reads them.

/// What is wrong with `tag` as a language that the user names; empty for nothing.
[[nodiscard]] std::string problemOfLanguage(const std::string& tag);

/// What is wrong with `path` as a path that the user names; empty for nothing.
[[nodiscard]] std::string problemOfPath(const std::string& path);

/// What is wrong with the words of a command line themselves: an option with nothing behind its
/// "=", which would take the next word. Empty for nothing.
[[nodiscard]] std::string problemOfWords(int count, char** words);

/// Reads a command line of these words into `Arguments` by a `Parser`, which has a `parse` that
/// throws an `Error` and gives its program by `app`. The exit status where the program is to end
/// at once, because help or the version was asked for, or because the line makes no sense. That
/// has been printed then.
template <class Arguments, class Parser, class Error>
[[nodiscard]] std::expected<Arguments, int> parseCommandLine(int count, char** words) {
    Arguments arguments;
    Parser parser(arguments);
    const auto& app = parser.app();
    const auto complain = [&app](const std::string& problem) {
        std::cerr << app.get_name() << ": " << device::oneLine(problem) << " (see "
                  << app.get_name() << " --help)\n";
        return std::unexpected(exitBadInput);
    };
    if (const std::string problem = problemOfWords(count, words); !problem.empty()) {
        return complain(problem);
    }
    try {
        parser.parse(count, words);
    } catch (const Error& error) {
        if (error.get_exit_code() == exitDone) {
            return std::unexpected(app.exit(error));
        }
        return complain(error.what());
    }
    return arguments;
}

} // namespace nimbra::host
