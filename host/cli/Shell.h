#pragma once

#include "host/cli/LineEditor.h"
#include "host/cli/PaneCommands.h"

#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::cli {

/// Commands on a pane that stays open. At a terminal it has a prompt and shows changes of the list
/// as they happen; otherwise it reads commands line by line from standard input.
class Shell {
public:
    /// The session's pane is open and shown. `out` gets the results, `messages` the failures.
    /// Nothing is owned; all outlive the shell.
    Shell(host::PaneSession& session, std::ostream& out, std::ostream& messages);

    /// Reads and does commands until the input ends or the user is done; the exit status.
    [[nodiscard]] int run();

private:
    using Outcome = PaneCommands::Outcome;
    using Words = std::vector<std::string>;
    struct Command;

    [[nodiscard]] static const std::vector<Command>& commands();
    [[nodiscard]] LineEditor::Completion completionsFor(std::string_view line) const;
    [[nodiscard]] int runAtTerminal();
    [[nodiscard]] int runLineByLine();
    [[nodiscard]] bool isDone() const;

    /// Does the command in `line`, and says why where it cannot.
    [[nodiscard]] int perform(const std::string& line);
    [[nodiscard]] Outcome dispatch(const std::string& line);
    /// Runs what waits on the main queue; what the user should see of it.
    [[nodiscard]] std::string takeChanges();

    Outcome list(const Words& arguments);
    Outcome get(const Words& arguments);
    Outcome set(const Words& arguments);
    Outcome tap(const Words& arguments);
    Outcome refresh(const Words& arguments);
    Outcome becomeActive(const Words& arguments);
    Outcome help(const Words& arguments);
    Outcome quit(const Words& arguments);

    host::PaneSession& _session;
    std::ostream& _out;
    std::ostream& _messages;
    PaneCommands _commands;
    /// How the user is asked where the commands come from.
    Ask _ask;
    bool _isRefreshing = false;
    bool _hasQuit = false;
};

} // namespace nimbra::cli
