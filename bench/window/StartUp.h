#pragma once

namespace nimbra::bench {

/// Prints how long a window with the open pane takes from its start to its first frame, and how
/// much memory, beside an empty window. Throws `std::runtime_error` when one cannot be started.
void measureStartUp();

} // namespace nimbra::bench
