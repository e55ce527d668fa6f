#pragma once

#include "platform/host/SettingsRootController.h"

namespace nimbra::host {

class Trace;

/// Traces when a page's task begins and ends.
class TracingRootController final : public SettingsRootController {
public:
    /// The trace is not owned and outlives this one.
    explicit TracingRootController(Trace& trace) : _trace(trace) {}

    void addTask(const std::shared_ptr<const Controller>& controller) override;
    void taskFinished(const std::shared_ptr<const Controller>& controller) override;

private:
    Trace& _trace;
};

} // namespace nimbra::host
