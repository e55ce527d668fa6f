#include "device/system/SerialQueue.h"

#include "device/system/CurrentQueue.h"

#include <utility>

namespace nimbra::device {

namespace {

thread_local const SerialQueue* currentQueue = nullptr;

} // namespace

SerialQueue::SerialQueue(std::string label, std::function<void()> workEnded)
    : _label(std::move(label)), _workEnded(std::move(workEnded)) {}

bool SerialQueue::add(WorkQueue::Work& work) {
    const std::scoped_lock lock(_mutex);
    if (_closed) {
        return false;
    }
    _work.push_back(std::move(work));
    _changed.notify_one();
    return true;
}

void SerialQueue::close() {
    const std::scoped_lock lock(_mutex);
    _closed = true;
    _changed.notify_one();
}

void SerialQueue::run() {
    const CurrentQueueScope scope(_label);
    currentQueue = this;
    while (auto work = next()) {
        (*work)();
        work.reset();
        _workEnded();
    }
    currentQueue = nullptr;
}

bool SerialQueue::isCurrent() const {
    return currentQueue == this;
}

std::optional<WorkQueue::Work> SerialQueue::next() {
    std::unique_lock lock(_mutex);
    _changed.wait(lock, [this] { return _closed || !_work.empty(); });
    if (_work.empty()) {
        return std::nullopt;
    }
    WorkQueue::Work work = std::move(_work.front());
    _work.pop_front();
    return work;
}

} // namespace nimbra::device
