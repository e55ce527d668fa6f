#pragma once

class QQuickWindow;

namespace nimbra::bench {

/// Writes a line to standard output as soon as `window` has been painted for the first time: the
/// most memory that the process has had until then, in kilobytes. Main thread, before the event
/// loop runs.
void tellFirstFrame(QQuickWindow& window);

} // namespace nimbra::bench
