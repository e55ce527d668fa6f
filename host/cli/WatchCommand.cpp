#include "host/cli/WatchCommand.h"

#include "host/cli/Interruption.h"
#include "host/cli/StatusText.h"
#include "host/cli/Waiting.h"
#include "host/core/PaneSession.h"

#include <csignal>
#include <optional>
#include <ostream>
#include <string>

namespace nimbra::cli {

std::expected<void, Failure> watch(host::PaneSession& session, std::ostream& out,
                                   const Terminal& terminal, bool isTerminal) {
    const Interruption interruption({SIGINT, SIGTERM, SIGHUP});
    session.settle();
    if (!session.isPaneOpen() || !session.footers().first()) {
        return std::unexpected(Failure{exitRefused, "the page shows no status: its switch is off"});
    }
    const std::string start = isTerminal ? "\r\x1b[K" : "";
    const std::string end = isTerminal ? "" : "\n";
    std::optional<std::string> shown;
    bool goesOn = true;
    while (goesOn) {
        session.runPending();
        const auto footer = session.isPaneOpen() ? session.footers().first() : nullptr;
        if (!footer) {
            break;
        }
        const auto description = host::FooterDescription::of(*footer);
        const std::string line =
            isTerminal ? statusLine(description, terminal.width - 1) : statusText(description);
        // Nothing to say at the beginning is no line.
        if (line != shown.value_or("")) {
            out << start << line << end << std::flush;
            shown = line;
        }
        goesOn = out && waitForWork(session);
    }
    if (isTerminal && !shown.value_or("").empty()) {
        out << '\n' << std::flush;
    }
    return {};
}

} // namespace nimbra::cli
