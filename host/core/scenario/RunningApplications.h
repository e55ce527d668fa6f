#pragma once

#include "device/apps/Process.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <map>
#include <mutex>
#include <set>
#include <string>

namespace nimbra::host {

/// The applications that run on a device while a scenario plays: for each a process that does
/// nothing until it is ended, recorded on the device. None outlives this program, however it ends.
class RunningApplications {
public:
    /// On the device in `root`; none runs yet.
    explicit RunningApplications(std::filesystem::path root);
    RunningApplications(const RunningApplications&) = delete;
    RunningApplications& operator=(const RunningApplications&) = delete;
    /// Ends all.
    ~RunningApplications();

    /// Lets just the applications `identifiers` run: starts those that do not, also those that
    /// have been ended meanwhile, and ends the others. The device directory exists. On an error,
    /// which names the record that cannot be written, some may run. Nothing after `end`. Main
    /// thread.
    [[nodiscard]] std::expected<void, Error> setRunning(const std::set<std::string>& identifiers);

    /// Ends all for good, and takes their records away. Any thread.
    void end();

private:
    [[nodiscard]] std::expected<void, Error> start(const std::string& identifier);
    [[nodiscard]] std::expected<std::filesystem::path, Error>
    recordOf(const std::string& identifier) const;
    void forgetEnded();
    void endProcess(const std::string& identifier, const device::Process& process) const;

    const device::DevicePaths _paths;
    std::mutex _mutex;
    /// The processes that were started and that nobody has waited for, by identifier. They are held
    /// rather than called by number: where SIGCHLD is ignored the number of one that has ended is
    /// free at once.
    std::map<std::string, device::Process> _processes;
    bool _hasEnded = false;
};

} // namespace nimbra::host
