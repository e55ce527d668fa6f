#include "tools/mrctl/Arguments.h"

#include "device/DeviceError.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <ranges>
#include <span>
#include <sstream>
#include <string_view>
#include <vector>

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

/// The first option among `words`, which begin with the program's name, that has nothing behind its
/// sign, "--root=": the word behind it would be taken for its value. Empty where there is none;
/// what stands behind "--" is no option.
std::string optionWithoutValue(std::span<char* const> words) {
    constexpr std::size_t leastSize = 4;
    for (const std::string_view word : words | std::views::drop(1)) {
        if (word == "--") {
            break;
        }
        if (word.size() >= leastSize && word.starts_with("--") &&
            word.find('=') == word.size() - 1) {
            return std::string(word.substr(0, word.size() - 1));
        }
    }
    return {};
}

/// Says that the command line makes no sense, and why; the exit status.
int refused(const std::string& why) {
    std::cerr << "mrctl: " + device::oneLine(why) + " (see mrctl --help)\n";
    return exitBadArguments;
}

/// What is wrong: with the first word that stands in the place of a command, if there is one.
std::string problemOf(const CLI::App& app, const CLI::ParseError& error) {
    const std::vector<std::string> words = app.remaining();
    const auto unknown = std::ranges::find_if(words, [](const auto& word) { return word != "--"; });
    const bool lacksCommand =
        error.get_exit_code() == static_cast<int>(CLI::ExitCodes::RequiredError) &&
        app.get_subcommands().empty();
    if (!lacksCommand || unknown == words.end()) {
        return error.what();
    }
    return *unknown + (unknown->starts_with('-') ? ": no such option" : ": no such command");
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
    const std::string option =
        optionWithoutValue(std::span(words, static_cast<std::size_t>(count)));
    if (!option.empty()) {
        return std::unexpected(refused(option + ": is empty"));
    }
    try {
        app.parse(count, words);
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
            return std::unexpected(printed(app, error));
        }
        return std::unexpected(refused(problemOf(app, error)));
    }
    return arguments;
}

} // namespace nimbra::mrctl
