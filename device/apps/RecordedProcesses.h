#pragma once

#include "device/apps/ApplicationProcesses.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <memory>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// The processes that are recorded in `run/nimbra`, a file for each running application; one that
/// has ended leaves no file.
///
/// A process that got the number of another is never ended: the record has to be younger than its
/// process, and the start time to be the one that it tells, if it does. Left alone are also the
/// processes that this one may not signal, the machine's first one and this one itself.
class RecordedProcesses final : public ApplicationProcesses {
public:
    /// A file that is no record, and a process that may not be signalled, is told to `log`, which
    /// is not owned and outlives this object and what it gives.
    RecordedProcesses(DevicePaths paths, SystemLog& log);

    [[nodiscard]] std::unique_ptr<EndingApplication>
    askToEnd(const BundleIdentifier& application) override;

    /// Whether the process that is recorded of `application` runs; nothing is changed or asked.
    [[nodiscard]] std::expected<bool, Error> isRunning(const BundleIdentifier& application) const;

private:
    [[nodiscard]] std::expected<std::unique_ptr<EndingApplication>, Error>
    ask(const BundleIdentifier& application) const;

    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
