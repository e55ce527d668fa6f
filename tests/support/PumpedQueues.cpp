#include "tests/support/PumpedQueues.h"

#include "device/system/DataOrSource.h"

#include <iterator>
#include <utility>

namespace nimbra::test {

std::shared_ptr<WorkQueue> PumpedQueues::serialQueueWithLabel(const std::string& label) {
    return _queues.emplace(label, std::make_shared<PumpedQueue>(label))->second;
}

PumpedQueue& PumpedQueues::globalQueueWithQuality(QualityClass /*quality*/) {
    // There is but one class.
    return _userInitiatedQueue;
}

std::shared_ptr<DataOrEventSource>
PumpedQueues::dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) {
    return std::make_shared<device::DataOrSource>(std::move(queue));
}

std::shared_ptr<TimerEventSource> PumpedQueues::timerSourceOnQueue(WorkQueue& /*queue*/) {
    return _timers.emplace_back(std::make_shared<FakeTimer>());
}

std::shared_ptr<PumpedQueue> PumpedQueues::queueLabelled(const std::string& label) const {
    const auto behindLast = _queues.upper_bound(label);
    if (behindLast == _queues.begin() || std::prev(behindLast)->first != label) {
        return nullptr;
    }
    return std::prev(behindLast)->second;
}

} // namespace nimbra::test
