#pragma once

#include "platform/system/WorkQueue.h"

#include <deque>
#include <functional>
#include <mutex>
#include <string>

namespace nimbra::test {

/// A queue that runs its work only when a test pumps it. Work may be queued on any thread.
class PumpedQueue final : public WorkQueue {
public:
    explicit PumpedQueue(std::string label);

    [[nodiscard]] const std::string& label() const override { return _label; }
    void async(Work work) override;
    /// Runs what is queued, then `work`, at once: the test's thread stands for the queue's.
    void sync(Work work) override;

    /// Runs the first piece of work; false when there was none.
    bool pumpOne();
    /// Runs all work, also what is queued meanwhile.
    void pump();
    [[nodiscard]] std::size_t pendingCount() const;

    /// Called where work is queued, to see how things stand then; not while other threads queue.
    std::function<void()> whenQueued;

private:
    std::string _label;
    mutable std::mutex _mutex;
    std::deque<Work> _work;
};

} // namespace nimbra::test
