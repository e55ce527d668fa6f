#pragma once

#include "platform/values/Identifier.h"

#include <chrono>
#include <memory>

namespace nimbra::device {

/// An application that has been asked to end. One thread at a time.
class EndingApplication {
public:
    EndingApplication() = default;
    EndingApplication(const EndingApplication&) = delete;
    EndingApplication& operator=(const EndingApplication&) = delete;
    virtual ~EndingApplication() = default;

    /// Waits for its end, at most this long; whether it has come.
    [[nodiscard]] virtual bool awaitEnd(std::chrono::milliseconds longest) = 0;
    /// Ends what still runs of it, whether it wants or not; does not wait.
    virtual void kill() = 0;
};

/// One way of knowing which processes an application runs in. One thread at a time.
class ApplicationProcesses {
public:
    ApplicationProcesses() = default;
    ApplicationProcesses(const ApplicationProcesses&) = delete;
    ApplicationProcesses& operator=(const ApplicationProcesses&) = delete;
    virtual ~ApplicationProcesses() = default;

    /// Asks the processes of `application` to end, without waiting for it. Null where this way
    /// knows of none, or of none that may be asked.
    [[nodiscard]] virtual std::unique_ptr<EndingApplication>
    askToEnd(const BundleIdentifier& application) = 0;
};

} // namespace nimbra::device
