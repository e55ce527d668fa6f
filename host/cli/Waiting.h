#pragma once

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::cli {

/// Waits until there is work on the session's main queue; false when the user wants no more (while
/// an `Interruption` lives) or nobody reads standard output any more. Main queue.
[[nodiscard]] bool waitForWork(host::PaneSession& session);

} // namespace nimbra::cli
