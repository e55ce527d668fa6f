#pragma once

#include "platform/system/Processes.h"

#include <string>

namespace nimbra {
class FileManager;
}

namespace nimbra::host {

class Trace;

/// Traces which programs are run, and how they end.
class TracingProcesses final : public Processes {
public:
    /// `files` tells what the machine calls the device's files. None is owned; all outlive this
    /// one.
    TracingProcesses(Processes& processes, FileManager& files, Trace& trace)
        : _processes(processes), _files(files), _trace(trace) {}

    [[nodiscard]] std::expected<pid_t, int> posix_spawn(const SpawnRequest& request) override;
    [[nodiscard]] std::expected<int, int> waitpid(pid_t process) override;

private:
    [[nodiscard]] std::string devicePath(const std::string& argument) const;

    Processes& _processes;
    FileManager& _files;
    Trace& _trace;
};

} // namespace nimbra::host
