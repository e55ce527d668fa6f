#include "host/cli/WatchCommand.h"

#include "host/cli/Interruption.h"
#include "host/cli/StatusText.h"
#include "host/core/PaneSession.h"

#include <array>
#include <csignal>
#include <optional>
#include <ostream>
#include <poll.h>
#include <string>
#include <unistd.h>

namespace nimbra::cli {

namespace {

/// Waits until there is work on the main queue; false when the user wants no more, or nobody reads
/// the output any more.
bool waitForWork(host::PaneSession& session) {
    std::array descriptors{
        pollfd{.fd = session.loop().wakeUpDescriptor(), .events = POLLIN, .revents = 0},
        pollfd{.fd = Interruption::descriptor(), .events = POLLIN, .revents = 0},
        // Of an output, only that it has gone.
        pollfd{.fd = STDOUT_FILENO, .events = 0, .revents = 0}};
    const auto& [work, interruption, output] = descriptors;
    while (true) {
        if (::poll(descriptors.data(), descriptors.size(), -1) < 0) {
            continue;
        }
        if (interruption.revents != 0 || output.revents != 0) {
            return false;
        }
        if (work.revents != 0) {
            return true;
        }
    }
}

} // namespace

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
