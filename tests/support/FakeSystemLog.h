#pragma once

#include "platform/system/SystemLog.h"

#include <functional>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// Keeps the lines of the enabled levels, all of them at first.
class FakeSystemLog final : public SystemLog {
public:
    using Lines = std::vector<std::pair<LogLevel, std::string>>;

    [[nodiscard]] bool isEnabled(LogLevel level) const override { return enabled.contains(level); }
    void write(LogLevel level, const std::string& message) override {
        onWrite();
        lines.emplace_back(level, message);
    }

    std::set<LogLevel> enabled{LogLevel::debug, LogLevel::standard, LogLevel::error};
    Lines lines;
    /// Called before a line is kept.
    std::function<void()> onWrite = [] {};
};

} // namespace nimbra::test
