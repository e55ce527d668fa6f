#pragma once

#include <string>

namespace nimbra {

enum class LogLevel { debug, standard, error };

/// The level as logs and traces call it: "debug", "default" or "error".
[[nodiscard]] constexpr const char* nameOf(LogLevel level) {
    switch (level) {
    case LogLevel::debug:
        return "debug";
    case LogLevel::standard:
        return "default";
    case LogLevel::error:
        return "error";
    }
    return "";
}

/// The platform's unified log, through its default handle. Any thread.
class SystemLog {
public:
    virtual ~SystemLog() = default;

    /// Whether a message of this level would be kept.
    [[nodiscard]] virtual bool isEnabled(LogLevel level) const = 0;

    /// Writes `message` as one line; nothing where its level is not enabled.
    virtual void write(LogLevel level, const std::string& message) = 0;
};

} // namespace nimbra
