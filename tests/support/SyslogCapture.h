#pragma once

#include "platform/system/Syslog.h"

#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// While it lives, the lines for `syslog` come here.
class SyslogCapture {
public:
    SyslogCapture()
        : _earlier(replaceSyslogSink([this](int priority, const std::string& message) {
              lines.emplace_back(priority, message);
          })) {}
    SyslogCapture(const SyslogCapture&) = delete;
    SyslogCapture& operator=(const SyslogCapture&) = delete;
    ~SyslogCapture() { replaceSyslogSink(std::move(_earlier)); }

    std::vector<std::pair<int, std::string>> lines;

private:
    SyslogSink _earlier;
};

} // namespace nimbra::test
