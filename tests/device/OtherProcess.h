#pragma once

#include <array>
#include <functional>
#include <gtest/gtest.h>
#include <sys/types.h>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {

/// A process of its own that does something when it is told to. Made before there are threads.
class OtherProcess {
public:
    explicit OtherProcess(const std::function<void()>& task) {
        EXPECT_EQ(::pipe(_start.data()), 0);
        _process = ::fork();
        if (_process == 0) {
            char byte = 0;
            if (::read(_start.front(), &byte, 1) == 1) {
                task();
            }
            // At once: nothing is tidied up, as when a process is killed.
            ::_exit(0);
        }
    }
    OtherProcess(const OtherProcess&) = delete;
    OtherProcess& operator=(const OtherProcess&) = delete;
    ~OtherProcess() {
        ::close(_start.front());
        ::close(_start.back());
    }

    /// Lets it do its task, and waits for its end.
    void run() {
        EXPECT_EQ(::write(_start.back(), "x", 1), 1);
        int status = 0;
        EXPECT_EQ(::waitpid(_process, &status, 0), _process);
        EXPECT_EQ(status, 0);
    }

private:
    std::array<int, 2> _start{};
    pid_t _process = 0;
};

} // namespace nimbra::test
