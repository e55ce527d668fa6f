#pragma once

#include "platform/values/Identifier.h"
#include "platform/values/Text.h"

namespace nimbra {

/// Why and how an application is to be ended.
struct Termination {
    /// The system's code for the occasion.
    int reason = 0;
    /// Whether its end is to be reported as a crash is.
    bool report = false;
    /// What the report says; absent for nothing.
    Text description;
};

/// Ends running applications. Any queue.
class AppTerminator {
public:
    virtual ~AppTerminator() = default;

    /// Asks for the end of the application `bundle` and returns at once. Nothing happens where it
    /// does not run.
    virtual void terminateApplication(const BundleIdentifier& bundle,
                                      const Termination& termination) = 0;
};

} // namespace nimbra
