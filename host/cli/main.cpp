#include "device/DevicePlatform.h"
#include "host/cli/Arguments.h"
#include "host/cli/Completion.h"
#include "host/cli/DeviceCreation.h"
#include "host/cli/Dialog.h"
#include "host/cli/Failure.h"
#include "host/cli/PaneCommands.h"
#include "host/cli/PlayCommand.h"
#include "host/cli/Shell.h"
#include "host/cli/TextLayout.h"
#include "host/cli/WatchCommand.h"
#include "host/core/AccountCheck.h"
#include "host/core/DeviceLocation.h"
#include "host/core/PaneSession.h"

#include <algorithm>
#include <clocale>
#include <csignal>
#include <iostream>
#include <unistd.h>

namespace nimbra::cli {

namespace {

using Outcome = std::expected<void, Failure>;
using SessionOutcome = std::expected<std::unique_ptr<host::PaneSession>, Failure>;

std::unexpected<Failure> badInput(const std::string& message) {
    return std::unexpected(Failure{exitBadInput, message});
}

SessionOutcome openPane(const Arguments& arguments) {
    const auto root = arguments.root.value_or(host::defaultDeviceDirectory());
    if (const auto provided = provideDevice(root, std::cerr); !provided) {
        return std::unexpected(provided.error());
    }
    auto session = host::PaneSession::start(
        {.root = root, .bundle = arguments.bundle, .locale = arguments.locale});
    if (!session) {
        return badInput(session.error().description);
    }
    if (arguments.account) {
        if (const auto known = host::checkAccount(**session, *arguments.account); !known) {
            return badInput(known.error().description);
        }
    }
    const auto opened =
        (*session)->openPane({.account = arguments.account, .firstSetup = arguments.firstSetup});
    if (!opened) {
        return badInput(opened.error().description);
    }
    (*session)->settle();
    return std::move(*session);
}

/// Says on `messages` what the pane is busy with, as soon as it is.
void showActivity(host::PaneSession& session, std::ostream& messages) {
    session.setActivityObserver([&session, &messages] {
        if (const std::string& activity = session.activity().string(); !activity.empty()) {
            messages << printable(activity) + '\n' << std::flush;
        }
    });
}

Outcome runOnPane(const Arguments& arguments) {
    const auto session = openPane(arguments);
    if (!session) {
        return std::unexpected(session.error());
    }
    showActivity(**session, std::cerr);
    // Only a page that is shown follows the sync.
    if (arguments.command == Command::list || arguments.command == Command::watch) {
        (*session)->appear();
        (*session)->settle();
    }
    PaneCommands commands(**session, std::cout);
    const auto withChanges = [&](const Outcome& outcome) {
        (*session)->settle();
        if (outcome) {
            std::cout << commands.takeChanges();
        }
        return outcome;
    };
    switch (arguments.command) {
    case Command::get:
        return commands.get(arguments.row);
    case Command::set:
        return withChanges(commands.set(arguments.row, arguments.value));
    case Command::tap:
        return withChanges(commands.tap(
            arguments.row, arguments.saysYes ? Ask() : askingStandardInput(std::cout)));
    case Command::watch:
        return watch(**session, std::cout, Terminal::ofStandardOutput(),
                     ::isatty(STDOUT_FILENO) != 0);
    default:
        return arguments.json ? commands.listAsJson() : commands.list();
    }
}

/// What rows can be called by, where that makes no device and says nothing of what is wrong:
/// whoever presses the tabulator did not ask for either.
void printRows(const Arguments& arguments,
               std::vector<std::string> (PaneCommands::*names)() const) {
    std::error_code ignored;
    if (!std::filesystem::exists(arguments.root.value_or(host::defaultDeviceDirectory()),
                                 ignored)) {
        return;
    }
    if (const auto session = openPane(arguments)) {
        const PaneCommands commands(**session, std::cout);
        for (const std::string& name : (commands.*names)()) {
            std::cout << name << '\n';
        }
    }
}

int runShell(const Arguments& arguments) {
    const auto session = openPane(arguments);
    if (!session) {
        std::cerr << "settingsctl: " << printable(session.error().message) << '\n';
        return session.error().exitStatus;
    }
    showActivity(**session, std::cerr);
    (*session)->appear();
    return Shell(**session, std::cout, std::cerr).run();
}

Outcome run(const Arguments& arguments) {
    switch (arguments.command) {
    case Command::init:
        return initializeDevice(arguments.directory, arguments.from, std::cout, std::cerr);
    case Command::play:
        return play({.scenario = arguments.scenario,
                     .keep = arguments.keep,
                     .bundle = arguments.bundle,
                     .locale = arguments.locale},
                    std::cout);
    case Command::completion:
        std::cout << (arguments.shellName == "bash" ? bashCompletion() : zshCompletion());
        return {};
    case Command::completeRows:
        printRows(arguments, &PaneCommands::rowNames);
        return {};
    case Command::completeIdentifiers:
        printRows(arguments, &PaneCommands::rowIdentifiers);
        return {};
    default:
        return runOnPane(arguments);
    }
}

int runProgram(int count, char** words) {
    // Whoever starts this program may not care how its children end, but it does.
    static_cast<void>(std::signal(SIGCHLD, SIG_DFL));
    const auto arguments = Arguments::parse(count, words);
    if (!arguments) {
        return arguments.error();
    }
    if (arguments->command == Command::shell) {
        return runShell(*arguments);
    }
    if (const Outcome outcome = run(*arguments); !outcome) {
        std::cerr << "settingsctl: " << printable(outcome.error().message) << '\n';
        return outcome.error().exitStatus;
    }
    if (!std::cout.flush()) {
        std::cerr << "settingsctl: the output cannot be written\n";
        return exitRefused;
    }
    return exitDone;
}

} // namespace

} // namespace nimbra::cli

int main(int count, char** words) {
    // The terminal's encoding; everything else follows the device's locale.
    std::setlocale(LC_CTYPE, "");
    return nimbra::cli::runProgram(count, words);
}
