#include "host/cli/Arguments.h"

#include "host/core/CommandLine.h"

#include <CLI/CLI.hpp>
#include <cstring>
#include <string_view>
#include <utility>

namespace nimbra::cli {

namespace {

constexpr const char* description =
    "Shows and drives the settings page of Nimbra Drive, the cloud document storage of an "
    "account.\n"
    "The page runs on a device: a directory laid out like a device's root, with its accounts and\n"
    "settings. The first use makes a sample device, so that there is something to try.\n";

constexpr const char* examples =
    "Examples:\n"
    "  settingsctl list                      what the page shows\n"
    "  settingsctl get \"Nimbra Drive\"        is it on?\n"
    "  settingsctl --locale de-DE list       the same in German\n"
    "  settingsctl watch                     how the sync is getting on\n"
    "  settingsctl init ./phone              a device to play with ...\n"
    "  settingsctl --root ./phone shell      ... and a prompt on it\n"
    "  settingsctl play fault.json           replay a fault report\n"
    "\n"
    "\"settingsctl COMMAND --help\" says more of a command, and the\n"
    "manual page settingsctl(1) all there is.";

/// The command line, and where its words go.
class Parser {
public:
    explicit Parser(Arguments& arguments) : _arguments(arguments) {
        _app.name("settingsctl");
        _app.footer(examples);
        _app.require_subcommand(0, 1);
        _app.fallthrough();
        _app.set_version_flag("--version", "settingsctl " NIMBRA_VERSION)
            ->description("Print the version and end");
        _app.set_help_flag("-h,--help", "Say this and end");
        addCommonOptions();
        addPaneCommands();
        addDeviceCommands();
        addHelpers();
    }

    void parse(int count, char** words) {
        _app.parse(count, words);
        if (_app.get_subcommands().empty()) {
            throw CLI::RequiredError("no command given", CLI::ExitCodes::RequiredError);
        }
        const bool isOnOwnDevice =
            _arguments.command == Command::play || _arguments.command == Command::init;
        for (const CLI::Option* option : _deviceOptions) {
            if (isOnOwnDevice && option->count() > 0) {
                throw CLI::ValidationError(option->get_name(),
                                           "makes no sense with a device of the command's own");
            }
        }
    }

    [[nodiscard]] const CLI::App& app() const { return _app; }

private:
    void addCommonOptions() {
        _deviceOptions = {
            _app.add_option("--root", _arguments.root,
                            "The device (default: ~/.local/state/nimbra/device)")
                ->type_name("DIR")
                ->check(host::problemOfPath),
            _app.add_option("--account", _arguments.account,
                            "The account (default: the device's first)")
                ->type_name("ID"),
            _app.add_flag("--first-setup", _arguments.firstSetup,
                          "Open the page as in the account's first setup"),
        };
        _app.add_option("--locale", _arguments.locale,
                        "The language, e.g. ja-JP (default: the device's)")
            ->type_name("TAG")
            ->check(host::problemOfLanguage);
        _app.add_option("--bundle", _arguments.bundle,
                        "The page's bundle (default: the installed one)")
            ->type_name("DIR")
            ->check(host::problemOfPath);
    }

    CLI::App* add(Command command, const std::string& name, const std::string& summary) {
        CLI::App* subcommand = _app.add_subcommand(name, summary);
        subcommand->callback([this, command] { _arguments.command = command; });
        return subcommand;
    }

    void addRow(CLI::App* command) {
        command->add_option("ROW", _arguments.row, "The row's name as shown, or its identifier")
            ->required()
            ->type_name("");
    }

    void addPaneCommands() {
        CLI::App* list = add(Command::list, "list", "Show the page's rows");
        list->add_flag("--json", _arguments.json, "Print an array of objects, for a program");

        CLI::App* get = add(Command::get, "get", "Print the value of a row: on, off or a text");
        addRow(get);

        CLI::App* set = add(Command::set, "set", "Turn a switch on or off");
        addRow(set);
        set->add_option("VALUE", _arguments.value, "on or off")->required()->type_name("");
        set->footer(
            "Prints what changes: + stands before a row that came, - before one that went,\n"
            "~ before one that is different now.");

        CLI::App* tap = add(Command::tap, "tap", "Press a button, or show the page of a link");
        addRow(tap);
        tap->add_flag("-y,--yes", _arguments.saysYes, "Answer yes to what the page asks");
        tap->footer("Where the button opens a screen, it is shown as text, and what it asks is\n"
                    "asked. Exit status: 1 when it failed or you did not want it.");

        add(Command::watch, "watch", "Show the status of the sync as it changes")
            ->footer(
                "Runs until it is interrupted (^C). A terminal gets one line that is drawn anew,\n"
                "everything else a line for each change.");

        add(Command::shell, "shell", "A prompt with these commands, on a page that stays open")
            ->footer("Without a terminal, commands are read line by line from standard input.");
    }

    void addDeviceCommands() {
        CLI::App* init = add(Command::init, "init", "Make a device directory");
        init->add_option("DIR", _arguments.directory, "Where; must not exist or be empty")
            ->required()
            ->type_name("")
            ->check(host::problemOfPath);
        init->add_option("--from", _arguments.from,
                         "The device's description (default: the sample's)")
            ->type_name("DEVICE.json")
            ->check(host::problemOfPath);

        CLI::App* play = add(Command::play, "play", "Play a scenario and print a trace of it");
        play->add_option("SCENARIO", _arguments.scenario,
                         "The scenario's file; - for standard input")
            ->required()
            ->type_name("")
            ->check(host::problemOfPath);
        play->add_option("--keep", _arguments.keep,
                         "Keep the device here; must not exist or be empty")
            ->type_name("DIR")
            ->check(host::problemOfPath);
        play->footer(
            "A scenario describes a device and what is done on it, step by step. The trace\n"
            "is one JSON object a line. Exit status: 1 for a step that could not be done,\n"
            "2 for a file that is no scenario.");
    }

    void addHelpers() {
        CLI::App* completion =
            add(Command::completion, "completion", "Print the completion script for a shell");
        completion->add_option("SHELL", _arguments.shellName, "bash or zsh")
            ->required()
            ->type_name("")
            ->check([](const std::string& shell) {
                return shell == "bash" || shell == "zsh" ? std::string()
                                                         : "bash or zsh expected, not " + shell;
            });
        completion->footer("For example: source <(settingsctl completion bash)");
        // For the completion scripts; nobody types them.
        add(Command::completeRows, "complete-rows", "Print the names of the rows")->group("");
        add(Command::completeIdentifiers, "complete-identifiers",
            "Print the identifiers of the rows")
            ->group("");
    }

    Arguments& _arguments;
    CLI::App _app{description};
    std::vector<CLI::Option*> _deviceOptions;
};

} // namespace

std::expected<Arguments, int> Arguments::parse(int count, char** words) {
    return host::parseCommandLine<Arguments, Parser, CLI::ParseError>(count, words);
}

} // namespace nimbra::cli
