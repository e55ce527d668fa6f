#include "platform/system/Syslog.h"

#include <mutex>
#include <syslog.h>
#include <utility>

namespace nimbra {

namespace {

struct Sink {
    std::mutex mutex;
    SyslogSink sink;
};

Sink& replaceableSink() {
    static Sink sink;
    return sink;
}

} // namespace

void writeSyslog(int priority, const std::string& message) {
    SyslogSink sink;
    {
        const std::scoped_lock lock(replaceableSink().mutex);
        sink = replaceableSink().sink;
    }
    if (sink) {
        sink(priority, message);
    } else {
        ::syslog(priority, "%s", message.c_str());
    }
}

SyslogSink replaceSyslogSink(SyslogSink sink) {
    const std::scoped_lock lock(replaceableSink().mutex);
    return std::exchange(replaceableSink().sink, std::move(sink));
}

} // namespace nimbra
