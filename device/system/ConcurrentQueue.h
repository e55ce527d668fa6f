#pragma once

#include "platform/system/WorkQueue.h"

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace nimbra::device {

/// The work of one queue of which any number of pieces may be under way at once, and the threads
/// that run it. Each piece starts at once, on a thread that has nothing to do or on a new one.
class ConcurrentQueue {
public:
    /// `workEnded` is called on a thread of the queue for each piece of work that was taken, once
    /// it has run and everything that it captured is gone.
    ConcurrentQueue(std::string label, std::function<void()> workEnded);
    ConcurrentQueue(const ConcurrentQueue&) = delete;
    ConcurrentQueue& operator=(const ConcurrentQueue&) = delete;
    /// Ends the threads as `finish` does.
    ~ConcurrentQueue();

    [[nodiscard]] const std::string& label() const { return _label; }

    /// Takes `work`, in the order of the calls; false, and `work` untouched, once the queue has
    /// finished. Any thread.
    [[nodiscard]] bool add(WorkQueue::Work& work);

    /// Waits for the work that was taken and ends the threads. Not on one of them.
    void finish();

private:
    void run();
    [[nodiscard]] std::optional<WorkQueue::Work> next();

    const std::string _label;
    const std::function<void()> _workEnded;
    std::mutex _mutex;
    std::condition_variable _changed;
    std::deque<WorkQueue::Work> _work;
    std::vector<std::thread> _threads;
    /// How many threads are about to look for work; never less than there are pieces of it.
    std::size_t _freeThreads = 0;
    bool _closed = false;
};

} // namespace nimbra::device
