#pragma once

#include "platform/system/WorkQueues.h"

#include <memory>
#include <string>

namespace nimbra::host {

class Trace;

/// Makes the queues and sources of another maker, and traces what is asked of timers and when they
/// fall due.
class TracingWorkQueues final : public WorkQueues {
public:
    /// Neither is owned; both outlive this one and the sources made by it.
    TracingWorkQueues(WorkQueues& queues, Trace& trace) : _queues(queues), _trace(trace) {}

    [[nodiscard]] WorkQueue& mainQueue() override;
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override;
    [[nodiscard]] WorkQueue& globalQueueWithQuality(QualityClass quality) override;
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override;
    [[nodiscard]] std::shared_ptr<TimerEventSource> timerSourceOnQueue(WorkQueue& queue) override;

private:
    WorkQueues& _queues;
    Trace& _trace;
};

} // namespace nimbra::host
