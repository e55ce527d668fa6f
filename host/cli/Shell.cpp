#include "host/cli/Shell.h"

#include "host/cli/ShellWords.h"
#include "host/cli/TextLayout.h"
#include "host/core/DeviceLocation.h"
#include "host/core/PaneSession.h"

#include <algorithm>
#include <iostream>
#include <unistd.h>

namespace nimbra::cli {

namespace {

std::string joined(const std::vector<std::string>& words, std::size_t count) {
    std::string text;
    for (std::size_t index = 0; index < count; ++index) {
        text += (index == 0 ? "" : " ") + words[index];
    }
    return text;
}

/// What a command takes.
enum class Arguments { none, json, row, rowAndValue };

bool isAccepted(Arguments arguments, const std::vector<std::string>& words) {
    switch (arguments) {
    case Arguments::none:
        return words.empty();
    case Arguments::json:
        return words.empty() || (words.size() == 1 && words.front() == "--json");
    case Arguments::row:
        return !words.empty();
    case Arguments::rowAndValue:
        return words.size() > 1;
    }
    return false;
}

} // namespace

struct Shell::Command {
    std::string_view name;
    Arguments arguments;
    std::string_view usage;
    std::string_view summary;
    Outcome (Shell::*perform)(const Words& arguments);
};

const std::vector<Shell::Command>& Shell::commands() {
    static const std::vector<Command> commands{
        {"list", Arguments::json, "list [--json]", "show the rows", &Shell::list},
        {"get", Arguments::row, "get ROW", "print a row's value", &Shell::get},
        {"set", Arguments::rowAndValue, "set ROW on|off", "turn a switch on or off", &Shell::set},
        {"tap", Arguments::row, "tap [--yes] ROW", "press a button, or show the page of a link",
         &Shell::tap},
        {"refresh", Arguments::none, "refresh",
         "pull the list down to look for changes in the cloud", &Shell::refresh},
        {"active", Arguments::none, "active", "come back from another application",
         &Shell::becomeActive},
        {"help", Arguments::none, "help", "show this", &Shell::help},
        {"quit", Arguments::none, "quit", "leave; so does ^D", &Shell::quit},
    };
    return commands;
}

Shell::Shell(host::PaneSession& session, std::ostream& out, std::ostream& messages)
    : _session(session), _out(out), _messages(messages), _commands(session, out) {}

int Shell::run() {
    return ::isatty(STDIN_FILENO) != 0 ? runAtTerminal() : runLineByLine();
}

int Shell::runAtTerminal() {
    _out << "The page is open. \"list\" shows its rows, \"help\" all commands.\n";
    LineEditor editor({.prompt = "nimbra> ",
                       .history = host::stateDirectory() / "history",
                       .wakeUpDescriptor = _session.loop().wakeUpDescriptor(),
                       .whenWoken = [this] { return takeChanges(); },
                       .complete = [this](std::string_view line) { return completionsFor(line); }});
    _ask = [this, &editor](const std::string& prompt) {
        _out << std::flush;
        return editor.readAnswer(prompt);
    };
    while (!isDone()) {
        const auto line = editor.readLine();
        // The pane may have closed while the user typed.
        if (!line || isDone()) {
            break;
        }
        static_cast<void>(perform(*line));
        _out << takeChanges() << std::flush;
    }
    return exitDone;
}

int Shell::runLineByLine() {
    int exitStatus = exitDone;
    _ask = askingStandardInput(_out);
    std::string line;
    while (!isDone() && std::getline(std::cin, line)) {
        if (const int status = perform(line); status != exitDone) {
            exitStatus = status;
        }
        _session.settle();
        _out << takeChanges() << std::flush;
    }
    return exitStatus;
}

bool Shell::isDone() const {
    return _hasQuit || !_session.isPaneOpen();
}

std::string Shell::takeChanges() {
    _session.runPending();
    std::string changes = _commands.takeChanges();
    if (_isRefreshing && !_session.isRefreshing()) {
        _isRefreshing = false;
        changes += "Refreshed.\n";
    }
    return changes;
}

int Shell::perform(const std::string& line) {
    if (const Outcome outcome = dispatch(line); !outcome) {
        _messages << "settingsctl: " << printable(outcome.error().message) << '\n' << std::flush;
        return outcome.error().exitStatus;
    }
    return exitDone;
}

Shell::Outcome Shell::dispatch(const std::string& line) {
    ShellWords split = ShellWords::split(line);
    if (!split.isClosed) {
        return std::unexpected(Failure{exitBadInput, "a quotation mark is not closed"});
    }
    if (split.words.empty()) {
        return {};
    }
    const std::string name = split.words.front();
    split.words.erase(split.words.begin());
    const auto command = std::ranges::find(commands(), name, &Command::name);
    if (command == commands().end()) {
        return std::unexpected(
            Failure{exitBadInput, "no command \"" + name + "\"; \"help\" lists them"});
    }
    if (!isAccepted(command->arguments, split.words)) {
        return std::unexpected(Failure{exitBadInput, "usage: " + std::string(command->usage)});
    }
    return (this->*command->perform)(split.words);
}

LineEditor::Completion Shell::completionsFor(std::string_view line) const {
    const ShellWords split = ShellWords::split(line);
    const bool startsWord = split.lastStart == line.size();
    const std::string typed = startsWord ? std::string() : split.words.back();
    const std::size_t place = split.words.size() - (startsWord ? 0 : 1);

    const auto startsAsTyped = [&typed](const std::string& choice) {
        return choice.starts_with(typed);
    };

    std::vector<std::string> choices;
    if (place == 0) {
        std::ranges::transform(commands(), std::back_inserter(choices),
                               [](const Command& command) { return std::string(command.name); });
    } else if (const auto command =
                   std::ranges::find(commands(), split.words.front(), &Command::name);
               command != commands().end()) {
        if (place == 1 && command->arguments == Arguments::json) {
            choices = {"--json"};
        } else if (place == 1 && command->arguments != Arguments::none) {
            choices = _commands.rowNames();
            if (std::ranges::none_of(choices, startsAsTyped)) {
                choices = _commands.rowIdentifiers();
            }
        } else if (place == 2 && command->arguments == Arguments::rowAndValue) {
            choices = {"on", "off"};
        }
    }
    LineEditor::Completion completion{.replaced = line.size() - split.lastStart, .candidates = {}};
    for (const std::string& choice : choices) {
        if (startsAsTyped(choice)) {
            completion.candidates.push_back(quotedWord(choice));
        }
    }
    return completion;
}

Shell::Outcome Shell::list(const Words& arguments) {
    return arguments.empty() ? _commands.list() : _commands.listAsJson();
}

Shell::Outcome Shell::get(const Words& arguments) {
    return _commands.get(joined(arguments, arguments.size()));
}

Shell::Outcome Shell::set(const Words& arguments) {
    return _commands.set(joined(arguments, arguments.size() - 1), arguments.back());
}

Shell::Outcome Shell::tap(const Words& arguments) {
    const bool saysYes = arguments.size() > 1 && arguments.front() == "--yes";
    const Words row(arguments.begin() + (saysYes ? 1 : 0), arguments.end());
    return _commands.tap(joined(row, row.size()), saysYes ? Ask() : _ask);
}

Shell::Outcome Shell::refresh(const Words& /*arguments*/) {
    _session.pullToRefresh();
    _isRefreshing = _session.isRefreshing();
    return {};
}

Shell::Outcome Shell::becomeActive(const Words& /*arguments*/) {
    _session.becomeActive();
    return {};
}

Shell::Outcome Shell::help(const Words& /*arguments*/) {
    for (const Command& command : commands()) {
        constexpr std::size_t column = 18;
        std::string line = "  " + std::string(command.usage);
        line.append(line.size() < column ? column - line.size() : 1, ' ');
        _out << line << command.summary << '\n';
    }
    _out
        << "A ROW is a row's name or its identifier. When the list changes, + stands before a row\n"
           "that came, - before one that went and ~ before one that is different now.\n";
    return {};
}

Shell::Outcome Shell::quit(const Words& /*arguments*/) {
    _hasQuit = true;
    return {};
}

} // namespace nimbra::cli
