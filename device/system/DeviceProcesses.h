#pragma once

#include "device/files/Descriptor.h"
#include "device/files/DevicePaths.h"
#include "device/system/PlannedOutcomes.h"
#include "platform/system/Processes.h"

#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

namespace nimbra::device {

/// Runs the programs that stand on the device, as processes of this machine. Any thread; nobody is
/// in a call any longer when it goes.
///
/// A program starts with the usual signals: whatever this process blocks or ignores, it does not.
/// It has this process's working directory.
class DeviceProcesses final : public Processes {
public:
    explicit DeviceProcesses(DevicePaths paths);
    DeviceProcesses(const DeviceProcesses&) = delete;
    DeviceProcesses& operator=(const DeviceProcesses&) = delete;
    /// Ends as `finish` does.
    ~DeviceProcesses() override;

    /// ECANCELED once it has finished.
    [[nodiscard]] std::expected<pid_t, int> posix_spawn(const SpawnRequest& request) override;
    /// ECHILD where there is nothing to wait for, ECANCELED when it finishes meanwhile.
    [[nodiscard]] std::expected<int, int> waitpid(pid_t process) override;

    /// From here on nothing starts, and nobody waits: whoever does goes on. A program that runs is
    /// asked to end, by SIGTERM, and may take its time.
    void finish();

    /// The outcomes of the next starts, one a call and in this order: an errno for one that fails
    /// without a process. Instead of those that were planned before.
    void planSpawnOutcomes(std::vector<std::optional<int>> outcomes);

private:
    struct Child;
    [[nodiscard]] std::expected<pid_t, int> start(const SpawnRequest& request) const;
    [[nodiscard]] std::expected<std::shared_ptr<const Child>, int> beginWaiting(pid_t process);
    [[nodiscard]] int awaitEnd(const Child& child) const;

    const DevicePaths _paths;
    PlannedOutcomes<int> _spawnOutcomes;
    /// Can be read from when it finishes.
    const Descriptor _finishing;
    std::mutex _mutex;
    /// Those that nobody has taken the status of.
    std::map<pid_t, std::shared_ptr<Child>> _children;
    bool _isFinished = false;
};

} // namespace nimbra::device
