#include "host/core/trace/TracingProcesses.h"

#include "host/core/trace/Trace.h"
#include "platform/system/FileManager.h"

#include <unistd.h>

namespace nimbra::host {

namespace {

/// What `descriptor` is opened on; null where it stays what it is.
nlohmann::ordered_json sinkOf(const SpawnRequest& request, int descriptor) {
    nlohmann::ordered_json sink;
    for (const SpawnFileActions::Open& open : request.fileActions.opens()) {
        if (open.descriptor == descriptor) {
            sink = open.path;
        }
    }
    return sink;
}

} // namespace

std::expected<pid_t, int> TracingProcesses::posix_spawn(const SpawnRequest& request) {
    auto spawned = _processes.posix_spawn(request);
    auto arguments = nlohmann::ordered_json::array();
    for (const std::string& argument : request.arguments) {
        arguments.push_back(devicePath(argument));
    }
    _trace.write("spawn",
                 {{"path", request.path},
                  {"argv", std::move(arguments)},
                  {"environment",
                   request.environment ? nlohmann::ordered_json(*request.environment) : nullptr},
                  {"result", spawned ? 0 : spawned.error()},
                  {"stdout", sinkOf(request, STDOUT_FILENO)},
                  {"stderr", sinkOf(request, STDERR_FILENO)}});
    return spawned;
}

std::expected<int, int> TracingProcesses::waitpid(pid_t process) {
    auto status = _processes.waitpid(process);
    if (status) {
        _trace.write("exit", {{"status", *status}});
    }
    return status;
}

/// A program is told where a file stands on the machine; here it goes by the device's own name.
std::string TracingProcesses::devicePath(const std::string& argument) const {
    std::string root = _files.fileSystemRepresentation(FileURL("/")).value_or("");
    while (root.ends_with('/')) {
        root.pop_back();
    }
    return argument.starts_with(root + '/') ? argument.substr(root.size()) : argument;
}

} // namespace nimbra::host
