#pragma once

#include "device/files/Descriptor.h"

#include <chrono>
#include <cstdint>
#include <expected>
#include <optional>
#include <sys/types.h>

namespace nimbra::device {

/// One process of this machine. Its number may go to another process when it has ended; this object
/// stays with the one that it was made for. Any thread.
class Process {
public:
    /// The process that has `number` now, or the errno why it cannot be had: ESRCH where there is
    /// none.
    [[nodiscard]] static std::expected<Process, int> withNumber(pid_t number);

    /// When it started, in clock ticks since the machine did; nothing where that cannot be read.
    [[nodiscard]] std::optional<std::uint64_t> startTime() const;
    /// Waits until it has ended, at most this long; whether it has. One that nobody has waited for
    /// yet counts as ended.
    [[nodiscard]] bool awaitEnd(std::chrono::milliseconds longest) const;
    /// Sends `signal`, or gives the errno why it cannot be sent: EPERM where that is not allowed,
    /// ESRCH where the process has gone.
    [[nodiscard]] std::expected<void, int> send(int signal) const;
    /// Waits for the end of a child of this process and takes its status; nothing, at once, for a
    /// process that is none.
    void reap() const;

private:
    Process(pid_t number, Descriptor descriptor);

    pid_t _number;
    Descriptor _descriptor;
};

} // namespace nimbra::device
