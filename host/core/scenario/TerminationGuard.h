#pragma once

#include <array>
#include <csignal>
#include <cstddef>
#include <functional>
#include <thread>

namespace nimbra::host {

/// While it lives, a signal that ends the program (SIGHUP, SIGINT, SIGPIPE, SIGTERM) first lets
/// something be put in order. One at a time in a process; main thread.
class TerminationGuard {
public:
    /// `putInOrder` runs on a thread of its own, while the others go on; the program ends with the
    /// signal when it returns.
    explicit TerminationGuard(std::function<void()> putInOrder);
    TerminationGuard(const TerminationGuard&) = delete;
    TerminationGuard& operator=(const TerminationGuard&) = delete;
    ~TerminationGuard();

private:
    static constexpr std::array _signals{SIGHUP, SIGINT, SIGPIPE, SIGTERM};

    std::thread _thread;
    /// What was done on the signals before, in their order.
    std::array<struct sigaction, _signals.size()> _earlier{};
};

} // namespace nimbra::host
