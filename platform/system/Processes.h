#pragma once

#include <expected>
#include <optional>
#include <string>
#include <sys/types.h>
#include <utility>
#include <vector>

namespace nimbra {

/// What a new process does with its descriptors before it runs.
class SpawnFileActions {
public:
    struct Open {
        int descriptor;
        std::string path;
        int flags;
        mode_t mode;
    };

    /// Opens `path` as `descriptor`, after what was added before.
    void addopen(int descriptor, std::string path, int flags, mode_t mode) {
        _opens.push_back(
            {.descriptor = descriptor, .path = std::move(path), .flags = flags, .mode = mode});
    }

    [[nodiscard]] const std::vector<Open>& opens() const { return _opens; }

private:
    std::vector<Open> _opens;
};

/// A program that is to run.
struct SpawnRequest {
    /// The device's own.
    std::string path;
    /// Their paths are the device's own; "/dev/null" is the machine's.
    SpawnFileActions fileActions;
    /// The first one is what the program is called.
    std::vector<std::string> arguments;
    /// An empty environment where there is none.
    std::optional<std::vector<std::string>> environment;
};

/// The programs that the pane has run: the POSIX calls of these names. Any queue.
class Processes {
public:
    virtual ~Processes() = default;

    /// Starts the program and returns at once, with the process or with an errno. Of this process's
    /// descriptors the new one has 0, 1 and 2 only, and of those what the file actions leave. It
    /// ignores no signal and blocks none, whatever this process does.
    [[nodiscard]] virtual std::expected<pid_t, int> posix_spawn(const SpawnRequest& request) = 0;

    /// Waits until `process`, which was started here and not waited for, has ended. Its status, as
    /// <sys/wait.h> takes it apart, or an errno.
    [[nodiscard]] virtual std::expected<int, int> waitpid(pid_t process) = 0;
};

} // namespace nimbra
