#pragma once

#include "platform/apps/AppTerminator.h"

namespace nimbra::host {

class Trace;

/// Traces which applications another terminator is asked to end.
class TracingAppTerminator final : public AppTerminator {
public:
    /// Neither is owned; both outlive this one.
    TracingAppTerminator(AppTerminator& terminator, Trace& trace)
        : _terminator(terminator), _trace(trace) {}

    void terminateApplication(const BundleIdentifier& bundle,
                              const Termination& termination) override;

private:
    AppTerminator& _terminator;
    Trace& _trace;
};

} // namespace nimbra::host
