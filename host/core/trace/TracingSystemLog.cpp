#include "host/core/trace/TracingSystemLog.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

namespace {

const char* nameOf(LogLevel level) {
    switch (level) {
    case LogLevel::debug:
        return "debug";
    case LogLevel::standard:
        return "default";
    case LogLevel::error:
        return "error";
    }
    return "error";
}

} // namespace

void TracingSystemLog::write(LogLevel level, const std::string& message) {
    _trace.write("log", {{"level", nameOf(level)}, {"message", message}});
}

} // namespace nimbra::host
