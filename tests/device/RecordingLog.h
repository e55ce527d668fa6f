#pragma once

#include "platform/system/SystemLog.h"

#include <mutex>
#include <string>
#include <vector>

namespace nimbra::test {

/// A log that keeps the lines of level error, and counts the others as mistakes of the test.
class RecordingLog final : public SystemLog {
public:
    [[nodiscard]] bool isEnabled(LogLevel /*level*/) const override { return true; }

    void write(LogLevel level, const std::string& message) override {
        const std::scoped_lock lock(_mutex);
        _lines.push_back(level == LogLevel::error ? message : "not an error: " + message);
    }

    [[nodiscard]] std::vector<std::string> lines() const {
        const std::scoped_lock lock(_mutex);
        return _lines;
    }

private:
    mutable std::mutex _mutex;
    std::vector<std::string> _lines;
};

} // namespace nimbra::test
