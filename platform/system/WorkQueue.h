#pragma once

#include <functional>
#include <string>

namespace nimbra {

/// Runs pieces of work in the order in which they came: one after the other, but for a global
/// queue, which may have several under way.
///
/// A piece of work and everything that it captured is destroyed on the queue when it ends, before
/// the next one starts: temporary objects never outlive their work item. Work that is queued when
/// the last owner lets the queue go still runs.
class WorkQueue {
public:
    using Work = std::move_only_function<void()>;

    WorkQueue() = default;
    WorkQueue(const WorkQueue&) = delete;
    WorkQueue& operator=(const WorkQueue&) = delete;
    virtual ~WorkQueue() = default;

    /// The name under which the queue appears in traces and debuggers.
    [[nodiscard]] virtual const std::string& label() const = 0;

    /// Queues `work` and returns at once. Any thread.
    virtual void async(Work work) = 0;

    /// Queues `work` and waits until it has run. Any thread but, of a serial queue, its own: a
    /// queue that waits for itself stops the program with a message.
    virtual void sync(Work work) = 0;
};

} // namespace nimbra
