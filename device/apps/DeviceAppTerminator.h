#pragma once

#include "device/apps/ApplicationProcesses.h"
#include "device/files/DevicePaths.h"
#include "platform/apps/AppTerminator.h"

#include <chrono>
#include <memory>
#include <vector>

namespace nimbra {
class SystemLog;
class WorkQueue;
class WorkQueues;
} // namespace nimbra

namespace nimbra::device {

/// Ends applications: asks each at once, on a queue of its own, and kills it where it still runs
/// when its time is over. An application that does not listen holds up no other. Any thread.
class DeviceAppTerminator final : public AppTerminator {
public:
    using Ways = std::vector<std::unique_ptr<ApplicationProcesses>>;

    /// The ways in which a device knows its running applications, the best one first. What is wrong
    /// with its records goes to `log`, which is not owned and outlives the ways.
    [[nodiscard]] static Ways waysOn(const DevicePaths& paths, SystemLog& log);

    /// An application is ended in the first of `ways` that knows it, and killed after `grace`.
    /// `queues` and `log` are not owned and outlive the terminator, which outlives the work on
    /// them.
    DeviceAppTerminator(Ways ways, WorkQueues& queues, SystemLog& log,
                        std::chrono::milliseconds grace = std::chrono::seconds(5));

    /// A termination that is to be reported leaves one line in the system log.
    void terminateApplication(const BundleIdentifier& bundle,
                              const Termination& termination) override;

private:
    /// On the queue.
    void end(const BundleIdentifier& bundle, const Termination& termination);
    void report(const BundleIdentifier& bundle, const Termination& termination);

    Ways _ways;
    WorkQueues& _queues;
    SystemLog& _log;
    const std::chrono::milliseconds _grace;
    std::shared_ptr<WorkQueue> _queue;
};

} // namespace nimbra::device
