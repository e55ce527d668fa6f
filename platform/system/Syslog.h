#pragma once

#include <functional>
#include <string>

namespace nimbra {

/// Takes one line for the system's `syslog`, with the priority of <syslog.h>.
using SyslogSink = std::function<void(int priority, const std::string& message)>;

/// Writes one line to `syslog`. Any thread.
void writeSyslog(int priority, const std::string& message);

/// Sends the lines to `sink` from now on, so that a host can show them; an empty sink restores
/// the system's own. Gives back the sink used until now. A line that another thread is writing
/// still reaches the earlier sink.
SyslogSink replaceSyslogSink(SyslogSink sink);

} // namespace nimbra
