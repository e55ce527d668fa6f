#pragma once

#include <cstdint>
#include <functional>

namespace nimbra {

/// A coalescing trigger of kind data-or: it collects values and calls its handler on its queue.
///
/// It is created suspended and without a handler. All data merged before the handler starts to
/// run leads to one call. Data merged while suspended waits for `resume`. When the last owner lets
/// the source go, a call that has not started is dropped.
class EventSource {
public:
    EventSource() = default;
    EventSource(const EventSource&) = delete;
    EventSource& operator=(const EventSource&) = delete;
    virtual ~EventSource() = default;

    /// Sets what is called on the source's queue. To be set before `resume`.
    virtual void setEventHandler(std::function<void()> handler) = 0;

    /// Lets the handler be called from now on.
    virtual void resume() = 0;

    /// Ors `value` into what is pending; zero asks for nothing. Any thread.
    virtual void mergeData(std::uintptr_t value) = 0;
};

} // namespace nimbra
