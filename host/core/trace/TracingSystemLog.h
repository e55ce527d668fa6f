#pragma once

#include "platform/system/SystemLog.h"

namespace nimbra::host {

class Trace;

/// Stands in for the system log of a pane that is traced: every line of every level goes to the
/// trace, and nowhere else.
class TracingSystemLog final : public SystemLog {
public:
    /// `trace` is not owned and outlives this one.
    explicit TracingSystemLog(Trace& trace) : _trace(trace) {}

    [[nodiscard]] bool isEnabled(LogLevel /*level*/) const override { return true; }
    void write(LogLevel level, const std::string& message) override;

private:
    Trace& _trace;
};

} // namespace nimbra::host
