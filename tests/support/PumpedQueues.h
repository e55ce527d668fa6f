#pragma once

#include "platform/system/WorkQueues.h"
#include "tests/support/FakeTimer.h"
#include "tests/support/PumpedQueue.h"

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

/// Queues that run only when a test pumps them, and timers that fall due only when a test says so.
class PumpedQueues final : public WorkQueues {
public:
    [[nodiscard]] PumpedQueue& mainQueue() override { return _mainQueue; }
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override;
    [[nodiscard]] PumpedQueue& globalQueueWithQuality(QualityClass quality) override;
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override;
    /// A `FakeTimer`, which calls its handler at once, whatever the queue.
    [[nodiscard]] std::shared_ptr<TimerEventSource> timerSourceOnQueue(WorkQueue& queue) override;

    /// The queue made last under `label`; null when none was.
    [[nodiscard]] std::shared_ptr<PumpedQueue> queueLabelled(const std::string& label) const;
    /// How many queues were made.
    [[nodiscard]] std::size_t queueCount() const { return _queues.size(); }

    /// Every timer that was made, in order.
    [[nodiscard]] const std::vector<std::shared_ptr<FakeTimer>>& timers() const { return _timers; }

private:
    PumpedQueue _mainQueue{"main"};
    PumpedQueue _userInitiatedQueue{"user-initiated"};
    std::multimap<std::string, std::shared_ptr<PumpedQueue>> _queues;
    std::vector<std::shared_ptr<FakeTimer>> _timers;
};

} // namespace nimbra::test
