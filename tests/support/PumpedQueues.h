#pragma once

#include "platform/system/WorkQueues.h"
#include "tests/support/PumpedQueue.h"

#include <map>
#include <memory>
#include <string>

namespace nimbra::test {

/// Queues that run only when a test pumps them.
class PumpedQueues final : public WorkQueues {
public:
    [[nodiscard]] PumpedQueue& mainQueue() override { return _mainQueue; }
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override;
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override;

    /// The queue made last under `label`; null when none was.
    [[nodiscard]] std::shared_ptr<PumpedQueue> queueLabelled(const std::string& label) const;
    /// How many queues were made.
    [[nodiscard]] std::size_t queueCount() const { return _queues.size(); }

private:
    PumpedQueue _mainQueue{"main"};
    std::multimap<std::string, std::shared_ptr<PumpedQueue>> _queues;
};

} // namespace nimbra::test
