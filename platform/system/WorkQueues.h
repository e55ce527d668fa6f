#pragma once

#include "platform/system/EventSource.h"
#include "platform/system/WorkQueue.h"

#include <cstdint>
#include <memory>
#include <string>

namespace nimbra {

/// How much the user cares when work is done; the number is the platform's.
enum class QualityClass : std::uint8_t { UserInitiatedQuality = 25 };
using enum QualityClass;

/// The main queue, and what makes further queues and event sources. Any thread.
class WorkQueues {
public:
    virtual ~WorkQueues() = default;

    /// The queue of the host's loop: rows, views and alerts are touched there only.
    [[nodiscard]] virtual WorkQueue& mainQueue() = 0;

    /// A new serial queue on a thread of the platform.
    [[nodiscard]] virtual std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) = 0;

    /// The queue that everybody shares for work of this quality class: work on it may wait for long
    /// without keeping other work from running.
    [[nodiscard]] virtual WorkQueue& globalQueueWithQuality(QualityClass quality) = 0;

    /// A new source of kind data-or, suspended, whose handler runs on `queue`.
    [[nodiscard]] virtual std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) = 0;

    /// A new source of kind timer, suspended and unarmed, whose handler runs on `queue`, which is
    /// not owned and outlives it.
    [[nodiscard]] virtual std::shared_ptr<TimerEventSource>
    timerSourceOnQueue(WorkQueue& queue) = 0;
};

} // namespace nimbra
