#include "device/apps/DeviceAppTerminator.h"

#include "device/apps/RecordedProcesses.h"
#include "device/apps/SystemdUnits.h"
#include "platform/system/SystemLog.h"
#include "platform/system/WorkQueues.h"

#include <string>
#include <utility>

namespace nimbra::device {

namespace {

/// Waits for the end of `application`, on a queue of its own.
void finish(EndingApplication& application, std::chrono::milliseconds grace) {
    if (application.awaitEnd(grace)) {
        return;
    }
    application.kill();
    // A killed process can still be held up by its disk, which is nothing to wait for forever.
    constexpr std::chrono::seconds longestDying(5);
    static_cast<void>(application.awaitEnd(longestDying));
}

} // namespace

DeviceAppTerminator::Ways DeviceAppTerminator::waysOn(const DevicePaths& paths, SystemLog& log) {
    Ways ways;
    if (paths.isThisMachine()) {
        ways.push_back(std::make_unique<SystemdUnits>());
    }
    ways.push_back(std::make_unique<RecordedProcesses>(paths, log));
    return ways;
}

DeviceAppTerminator::DeviceAppTerminator(Ways ways, WorkQueues& queues, SystemLog& log,
                                         std::chrono::milliseconds grace)
    : _ways(std::move(ways)), _queues(queues), _log(log), _grace(grace),
      _queue(queues.serialQueueWithLabel("app-termination")) {}

void DeviceAppTerminator::terminateApplication(const BundleIdentifier& bundle,
                                               const Termination& termination) {
    _queue->async([this, bundle, termination] { end(bundle, termination); });
}

void DeviceAppTerminator::end(const BundleIdentifier& bundle, const Termination& termination) {
    for (const auto& way : _ways) {
        if (auto application = way->askToEnd(bundle)) {
            report(bundle, termination);
            // On the queue the next application is waiting to be asked.
            _queues.serialQueueWithLabel("app-termination-wait")
                ->async([application = std::move(application), grace = _grace] {
                    finish(*application, grace);
                });
            return;
        }
    }
}

void DeviceAppTerminator::report(const BundleIdentifier& bundle, const Termination& termination) {
    if (!termination.report) {
        return;
    }
    std::string line =
        "Terminated " + bundle.string() + ", reason " + std::to_string(termination.reason);
    if (termination.description) {
        line += ": " + termination.description.string();
    }
    _log.write(LogLevel::standard, line);
}

} // namespace nimbra::device
