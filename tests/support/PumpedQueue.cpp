#include "tests/support/PumpedQueue.h"

#include <utility>

namespace nimbra::test {

PumpedQueue::PumpedQueue(std::string label) : _label(std::move(label)) {}

void PumpedQueue::async(Work work) {
    if (whenQueued) {
        whenQueued();
    }
    const std::scoped_lock lock(_mutex);
    _work.push_back(std::move(work));
}

void PumpedQueue::sync(Work work) {
    pump();
    work();
}

bool PumpedQueue::pumpOne() {
    Work work;
    {
        const std::scoped_lock lock(_mutex);
        if (_work.empty()) {
            return false;
        }
        work = std::move(_work.front());
        _work.pop_front();
    }
    work();
    return true;
}

void PumpedQueue::pump() {
    while (pumpOne()) {
    }
}

std::size_t PumpedQueue::pendingCount() const {
    const std::scoped_lock lock(_mutex);
    return _work.size();
}

} // namespace nimbra::test
