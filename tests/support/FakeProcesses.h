#pragma once

#include "platform/system/Processes.h"

#include <string>
#include <vector>

namespace nimbra::test {

/// Notes which programs are run, and ends them as a test says.
class FakeProcesses final : public Processes {
public:
    explicit FakeProcesses(std::vector<std::string>& calls) : _calls(calls) {}

    [[nodiscard]] std::expected<pid_t, int> posix_spawn(const SpawnRequest& request) override {
        _calls.push_back("spawn " + request.path);
        requests.push_back(request);
        return spawned;
    }
    [[nodiscard]] std::expected<int, int> waitpid(pid_t process) override {
        _calls.push_back("wait for " + std::to_string(process));
        return status;
    }

    std::expected<pid_t, int> spawned = 42;
    std::expected<int, int> status = 0;
    std::vector<SpawnRequest> requests;

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
