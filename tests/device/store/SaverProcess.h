#pragma once

#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <spawn.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {

/// A process of account-saver, whose standard output comes here.
class SaverProcess {
public:
    SaverProcess(const std::filesystem::path& database, const std::string& what, int times) {
        int ends[2] = {-1, -1};
        EXPECT_EQ(::pipe2(static_cast<int*>(ends), O_CLOEXEC), 0);
        _output = ends[0];
        posix_spawn_file_actions_t actions;
        ::posix_spawn_file_actions_init(&actions);
        ::posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
        std::string program = NIMBRA_TEST_ACCOUNT_SAVER;
        std::string path = database.string();
        std::string kind = what;
        std::string count = std::to_string(times);
        char* const words[] = {program.data(), path.data(), kind.data(), count.data(), nullptr};
        EXPECT_EQ(::posix_spawn(&_process, program.c_str(), &actions, nullptr,
                                static_cast<char* const*>(words), environ),
                  0);
        ::posix_spawn_file_actions_destroy(&actions);
        ::close(ends[1]);
    }
    SaverProcess(const SaverProcess&) = delete;
    SaverProcess& operator=(const SaverProcess&) = delete;
    ~SaverProcess() { ::close(_output); }

    /// Waits until so many saves have been made, or the process has ended.
    void awaitSaves(int saves) const {
        char byte = 0;
        for (int made = 0; made < saves && ::read(_output, &byte, 1) == 1; ++made) {
        }
    }
    void kill() const { ::kill(_process, SIGKILL); }
    /// Waits for the end; the raw status.
    int await() const {
        int status = -1;
        ::waitpid(_process, &status, 0);
        return status;
    }

private:
    pid_t _process = -1;
    int _output = -1;
};

} // namespace nimbra::test
