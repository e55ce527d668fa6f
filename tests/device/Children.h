#pragma once

#include <cerrno>
#include <csignal>
#include <gtest/gtest.h>
#include <sys/types.h>
#include <sys/wait.h>
#include <thread>

namespace nimbra::test {

/// Waits until `process` has ended and somebody else has taken its status.
inline void awaitNothingLeft(pid_t process) {
    siginfo_t information{};
    // This returns when it has ended, without taking anything, or because nothing is left.
    while (::waitid(P_PID, static_cast<id_t>(process), &information, WEXITED | WNOWAIT) == 0) {
        std::this_thread::yield();
    }
    EXPECT_EQ(errno, ECHILD);
}

} // namespace nimbra::test
