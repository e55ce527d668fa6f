#pragma once

#include <csignal>
#include <gtest/gtest.h>
#include <spawn.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {

/// A process of the test's own that does nothing until it is ended, at the latest with this object.
class ChildProcess {
public:
    enum class Manner { listens, ignoresTerm };

    explicit ChildProcess(Manner manner = Manner::listens, std::string program = "sleep") {
        // A signal that is ignored stays so in a new program: there is no moment in which the
        // process would still listen.
        const auto earlier = std::signal(SIGTERM, manner == Manner::listens ? SIG_DFL : SIG_IGN);
        std::string time = "infinity";
        char* const words[] = {program.data(), time.data(), nullptr};
        EXPECT_EQ(::posix_spawnp(&_number, program.c_str(), nullptr, nullptr,
                                 static_cast<char* const*>(words), environ),
                  0);
        static_cast<void>(std::signal(SIGTERM, earlier));
    }
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;
    ~ChildProcess() {
        if (!_isReaped) {
            kill();
            static_cast<void>(await());
        }
    }

    [[nodiscard]] pid_t number() const { return _number; }

    /// Whether it has not ended, as the system sees it now.
    [[nodiscard]] bool isRunning() {
        int status = 0;
        _isReaped = _isReaped || ::waitpid(_number, &status, WNOHANG) != 0;
        return !_isReaped;
    }
    void kill() const { ::kill(_number, SIGKILL); }
    /// Waits for its end; the signal that ended it, or 0.
    int await() {
        int status = 0;
        EXPECT_EQ(::waitpid(_number, &status, 0), _number);
        _isReaped = true;
        return WIFSIGNALED(status) ? WTERMSIG(status) : 0;
    }
    /// Waits for its end without taking its status: it stays a process that has ended.
    void awaitUnreaped() const {
        siginfo_t information{};
        EXPECT_EQ(::waitid(P_PID, static_cast<id_t>(_number), &information, WEXITED | WNOWAIT), 0);
    }

private:
    pid_t _number = -1;
    bool _isReaped = false;
};

} // namespace nimbra::test
