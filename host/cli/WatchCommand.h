#pragma once

#include "host/cli/Failure.h"
#include "host/cli/Terminal.h"

#include <expected>
#include <iosfwd>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::cli {

/// Shows the status footer of the open pane as it changes, until the user interrupts it (SIGINT,
/// SIGTERM or SIGHUP), the page closes, or nobody reads `out` any more: one line that is drawn anew
/// at a terminal, else a line for each change. Refused where there is no status footer. Main queue.
[[nodiscard]] std::expected<void, Failure> watch(host::PaneSession& session, std::ostream& out,
                                                 const Terminal& terminal, bool isTerminal);

} // namespace nimbra::cli
