#pragma once

#include "host/core/trace/SessionTracer.h"
#include "host/core/trace/Trace.h"
#include "tests/support/SyslogCapture.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::host {

using Lines = std::vector<std::string>;

/// A tracer over a platform of fakes, and what it has traced.
class Tracers : public testing::Test {
protected:
    /// What was traced since the last call, without the queue, which is the same everywhere.
    Lines takeLines() {
        Lines lines;
        for (std::string line : std::exchange(_lines, {})) {
            const std::string queue = R"("queue":"other",)";
            line.erase(line.find(queue), queue.size());
            lines.push_back(line);
        }
        return lines;
    }

    test::SyslogCapture _syslog;
    test::TestPlatform _platform;
    Lines _lines;
    Trace _trace{[this](const std::string& line) { _lines.push_back(line); }};
    SessionTracer _tracer{_platform.services(), _trace};
    PlatformServices _services = _tracer.services();
};

} // namespace nimbra::host
