#pragma once

#include "device/files/Descriptor.h"
#include "device/system/TimeSource.h"

#include <mutex>
#include <thread>

namespace nimbra::device {

/// The machine's own time. A thread waits for the deadlines; it starts with the first of them.
class MachineTime final : public TimeSource {
public:
    MachineTime() = default;
    MachineTime(const MachineTime&) = delete;
    MachineTime& operator=(const MachineTime&) = delete;
    /// Ends the thread.
    ~MachineTime() override;

    [[nodiscard]] std::chrono::nanoseconds elapsed() const override;
    [[nodiscard]] Date now() const override;
    void setWake(std::function<void()> wake) override;
    [[nodiscard]] bool wakeAt(std::optional<std::chrono::nanoseconds> deadline) override;

private:
    void start();
    void end();
    void run();
    void set(std::chrono::nanoseconds deadline) const;

    std::mutex _mutex;
    std::function<void()> _wake;
    std::optional<Descriptor> _timer;
    std::thread _thread;
    bool _isEnding = false;
};

} // namespace nimbra::device
