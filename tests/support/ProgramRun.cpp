#include "tests/support/ProgramRun.h"

#include <algorithm>
#include <cstddef>
#include <fcntl.h>
#include <iterator>
#include <spawn.h>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {

namespace {

std::vector<char*> pointers(std::vector<std::string>& strings) {
    std::vector<char*> result;
    std::ranges::transform(strings, std::back_inserter(result),
                           [](std::string& string) { return string.data(); });
    result.push_back(nullptr);
    return result;
}

/// A file without a name, for what a program reads or writes.
class Scratch {
public:
    explicit Scratch(const std::string& content = {})
        : _file(::open("/tmp", O_TMPFILE | O_RDWR | O_CLOEXEC, 0600)) {
        if (_file < 0 || ::write(_file, content.data(), content.size()) !=
                             static_cast<ssize_t>(content.size())) {
            throw std::runtime_error("no scratch file");
        }
        ::lseek(_file, 0, SEEK_SET);
    }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    ~Scratch() { ::close(_file); }

    [[nodiscard]] int file() const { return _file; }

    [[nodiscard]] std::string content() const {
        std::string content(static_cast<std::size_t>(::lseek(_file, 0, SEEK_END)), '\0');
        static_cast<void>(::pread(_file, content.data(), content.size(), 0));
        return content;
    }

private:
    int _file;
};

} // namespace

pid_t startProgram(std::vector<std::string> command, std::vector<std::string> environment,
                   const std::array<int, 3>& files) {
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    for (int file = 0; file < 3; ++file) {
        const int source = files.at(static_cast<std::size_t>(file));
        if (source < 0) {
            ::posix_spawn_file_actions_addclose(&actions, file);
        } else {
            ::posix_spawn_file_actions_adddup2(&actions, source, file);
        }
    }
    pid_t process = 0;
    const int failure = ::posix_spawnp(&process, command.front().c_str(), &actions, nullptr,
                                       pointers(command).data(), pointers(environment).data());
    ::posix_spawn_file_actions_destroy(&actions);
    if (failure != 0) {
        throw std::runtime_error("cannot start " + command.front());
    }
    return process;
}

ProgramResult runProgram(const std::vector<std::string>& command,
                         const std::vector<std::string>& environment, const std::string& input) {
    const Scratch in(input);
    const Scratch out;
    const Scratch messages;
    const pid_t process =
        startProgram(command, environment, {in.file(), out.file(), messages.file()});
    int status = 0;
    ::waitpid(process, &status, 0);
    return {exitStatusOf(status), out.content(), messages.content()};
}

int exitStatusOf(int waited) {
    return WIFEXITED(waited) ? WEXITSTATUS(waited) : -WTERMSIG(waited);
}

} // namespace nimbra::test
