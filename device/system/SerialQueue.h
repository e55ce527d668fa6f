#pragma once

#include "platform/system/WorkQueue.h"

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <optional>
#include <string>

namespace nimbra::device {

/// The work of one serial queue, between those who queue it and the one thread that runs it.
class SerialQueue {
public:
    /// `workEnded` is called on the thread of `run` for each piece of work that was taken, once
    /// it has run and everything that it captured is gone.
    SerialQueue(std::string label, std::function<void()> workEnded);

    [[nodiscard]] const std::string& label() const { return _label; }

    /// Puts `work` behind what is queued; false, and `work` untouched, once the queue is closed.
    /// Any thread.
    [[nodiscard]] bool add(WorkQueue::Work& work);

    /// Lets `run` return when it has run what is queued. Any thread.
    void close();

    /// Runs the work in order until the queue is closed and empty.
    void run();

    /// Whether the calling thread is in `run` of this queue.
    [[nodiscard]] bool isCurrent() const;

private:
    [[nodiscard]] std::optional<WorkQueue::Work> next();

    const std::string _label;
    const std::function<void()> _workEnded;
    std::mutex _mutex;
    std::condition_variable _changed;
    std::deque<WorkQueue::Work> _work;
    bool _closed = false;
};

} // namespace nimbra::device
