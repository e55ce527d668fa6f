#include "host/core/trace/TracingSystemLog.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

void TracingSystemLog::write(LogLevel level, const std::string& message) {
    _trace.write("log", {{"level", nameOf(level)}, {"message", message}});
}

} // namespace nimbra::host
