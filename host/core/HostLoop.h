#pragma once

#include "platform/system/WorkQueue.h"

#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>

namespace nimbra::device {
class DeviceWorkQueues;
}

namespace nimbra::host {

/// The main queue of a host without a window: the thread that makes the loop runs its work, when
/// it calls one of the `run` operations. `async` is for any thread, `sync` for any other thread.
class HostLoop final : public WorkQueue {
public:
    HostLoop();
    /// Runs what is still queued.
    ~HostLoop() override;

    /// "main".
    [[nodiscard]] const std::string& label() const override;
    void async(Work work) override;
    void sync(Work work) override;

    /// A file descriptor that is readable while work is queued, and once `queues` that are followed
    /// have become idle, for the caller's own `poll`; the `run` operations take its signal back.
    /// Owned by the loop.
    [[nodiscard]] int wakeUpDescriptor() const;

    /// From now on wakes up also each time `queues` become idle, although they may have handed
    /// nothing over: whoever waits for the end of everything asks `isIdle` then. It takes the place
    /// of the queues' idle observer.
    void follow(device::DeviceWorkQueues& queues);
    /// Whether nothing is left to do, at one moment: no work is queued or under way here nor on
    /// `queues`. It is not idle while it runs the work that asks. Any thread.
    [[nodiscard]] bool isIdle(const device::DeviceWorkQueues& queues) const;

    /// Calls `observer` at the start of each run and after each piece of work: what follows what
    /// the main queue has done stands before what it does next.
    void setTurnObserver(std::function<void()> observer) { _turnObserver = std::move(observer); }

    /// Runs the work that is queued now, but not what that work queues in turn. Says whether there
    /// was any.
    bool runPending();

    /// Runs work, waiting for more, until none is queued here and `queues` are idle: what the
    /// background hands over at its end is run, too. It follows `queues` from then on.
    void runUntilIdle(device::DeviceWorkQueues& queues);

private:
    class WakeUp;

    [[nodiscard]] bool isEmpty() const;

    const std::thread::id _thread;
    /// Shared with whoever may signal it late, when the loop has gone.
    std::shared_ptr<WakeUp> _wakeUp;
    mutable std::mutex _mutex;
    std::deque<Work> _pending;
    /// How many pieces of work have come, and how many of them have ended.
    std::size_t _queued = 0;
    std::size_t _ended = 0;
    std::function<void()> _turnObserver = [] {};
};

} // namespace nimbra::host
