#include "device/system/DataOrSource.h"

#include <mutex>
#include <utility>

namespace nimbra::device {

struct DataOrSource::State {
    std::mutex mutex;
    std::function<void()> handler;
    std::uintptr_t pending = 0;
    bool resumed = false;
    /// A call is queued that has not started: it takes whatever is pending by then.
    bool queued = false;
};

DataOrSource::DataOrSource(std::shared_ptr<WorkQueue> queue)
    : _queue(std::move(queue)), _state(std::make_shared<State>()) {}

void DataOrSource::setEventHandler(std::function<void()> handler) {
    const std::scoped_lock lock(_state->mutex);
    _state->handler = std::move(handler);
}

void DataOrSource::resume() {
    {
        const std::scoped_lock lock(_state->mutex);
        _state->resumed = true;
    }
    callHandlerSoon();
}

void DataOrSource::mergeData(std::uintptr_t value) {
    {
        const std::scoped_lock lock(_state->mutex);
        _state->pending |= value;
    }
    callHandlerSoon();
}

void DataOrSource::callHandlerSoon() {
    {
        const std::scoped_lock lock(_state->mutex);
        if (!_state->resumed || _state->pending == 0 || _state->queued) {
            return;
        }
        _state->queued = true;
    }
    // The queued call does not own the source: letting the source go drops it.
    _queue->async([weakState = std::weak_ptr(_state)] {
        const auto state = weakState.lock();
        if (!state) {
            return;
        }
        {
            const std::scoped_lock lock(state->mutex);
            state->queued = false;
            state->pending = 0;
        }
        if (state->handler) {
            state->handler();
        }
    });
}

} // namespace nimbra::device
