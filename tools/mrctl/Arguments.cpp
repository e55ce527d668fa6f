#include "tools/mrctl/Arguments.h"

#include "device/DeviceError.h"

#include <CLI/CLI.hpp>
#include <iostream>
#include <sstream>

namespace nimbra::mrctl {

namespace {

/// What is wrong with `path` as a path that the user names; empty for nothing.
std::string problemOfPath(const std::string& path) {
    return path.empty() ? "is empty" : "";
}

void addDiagnose(CLI::App& app, Arguments& arguments) {
    CLI::App* const command =
        app.add_subcommand("diagnose", "Write an archive for somebody who looks for a fault");
    command->callback([&arguments] { arguments.command = Command::diagnose; });
    command->add_option("PATH", arguments.path, "The archive, usually called NAME.tar.gz")
        ->required()
        ->type_name("")
        ->check(problemOfPath);
    command->add_flag("--no-logarchive", arguments.withoutLog, "Leave the log out");
    command->footer("Names, addresses, tokens and the like stand as pseudonyms in it.");
}

void addStatus(CLI::App& app, Arguments& arguments) {
    CLI::App* const command = app.add_subcommand("status", "Print what the document service knows");
    command->callback([&arguments] { arguments.command = Command::status; });
    command->add_flag("--json", arguments.asJson, "Print an object, for a program");
}

/// Prints the help or the version that `wish` asks for; the exit status.
int printed(const CLI::App& app, const CLI::ParseError& wish) {
    std::ostringstream text;
    const int status = app.exit(wish, text, text);
    if (!(std::cout << text.str()).flush()) {
        std::cerr << "mrctl: the output cannot be written\n";
        return exitFailed;
    }
    return status;
}

} // namespace

std::expected<Arguments, int> Arguments::parse(int count, char** words) {
    Arguments arguments;
    CLI::App app("Tells of the document service of a device: to its user, or to somebody who looks "
                 "for a fault.");
    app.name("mrctl");
    app.require_subcommand(1);
    app.fallthrough();
    app.set_version_flag("--version", "mrctl " NIMBRA_VERSION)
        ->description("Print the version and end");
    app.set_help_flag("-h,--help", "Say this and end");
    app.add_option("--root", arguments.root, "The device (default: this machine)")
        ->type_name("DIR")
        ->check(problemOfPath);
    addDiagnose(app, arguments);
    addStatus(app, arguments);
    try {
        app.parse(count, words);
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
            return std::unexpected(printed(app, error));
        }
        std::cerr << "mrctl: " + device::oneLine(error.what()) + " (see mrctl --help)\n";
        return std::unexpected(exitBadArguments);
    }
    return arguments;
}

} // namespace nimbra::mrctl
