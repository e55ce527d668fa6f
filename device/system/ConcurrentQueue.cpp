#include "device/system/ConcurrentQueue.h"

#include "device/system/CurrentQueue.h"
#include "device/system/ThreadName.h"

#include <utility>

namespace nimbra::device {

ConcurrentQueue::ConcurrentQueue(std::string label, std::function<void()> workEnded)
    : _label(std::move(label)), _workEnded(std::move(workEnded)) {}

ConcurrentQueue::~ConcurrentQueue() {
    finish();
}

bool ConcurrentQueue::add(WorkQueue::Work& work) {
    const std::scoped_lock lock(_mutex);
    if (_closed) {
        return false;
    }
    if (_freeThreads == _work.size()) {
        _threads.emplace_back([this] { run(); });
        ++_freeThreads;
    }
    _work.push_back(std::move(work));
    _changed.notify_one();
    return true;
}

void ConcurrentQueue::finish() {
    std::vector<std::thread> threads;
    {
        const std::scoped_lock lock(_mutex);
        _closed = true;
        _changed.notify_all();
        threads.swap(_threads);
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

void ConcurrentQueue::run() {
    nameCurrentThread(_label);
    const CurrentQueueScope scope(_label);
    while (auto work = next()) {
        (*work)();
        work.reset();
        _workEnded();
        // Not earlier: whoever was told may wait for further work of this queue.
        const std::scoped_lock lock(_mutex);
        ++_freeThreads;
    }
}

std::optional<WorkQueue::Work> ConcurrentQueue::next() {
    std::unique_lock lock(_mutex);
    _changed.wait(lock, [this] { return _closed || !_work.empty(); });
    if (_work.empty()) {
        return std::nullopt;
    }
    --_freeThreads;
    WorkQueue::Work work = std::move(_work.front());
    _work.pop_front();
    return work;
}

} // namespace nimbra::device
