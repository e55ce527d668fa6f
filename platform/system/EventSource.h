#pragma once

#include <chrono>
#include <cstdint>
#include <functional>

namespace nimbra {

/// Calls its handler on its queue when something has come about. It is created suspended and
/// without a handler. A call that has not started when the last owner lets the source go is
/// dropped. Any thread, where a kind says nothing else.
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
};

/// A coalescing trigger of kind data-or: it collects values. All data merged before the handler
/// starts to run leads to one call. Data merged while suspended waits for `resume`.
class DataOrEventSource : public EventSource {
public:
    /// Ors `value` into what is pending; zero asks for nothing. Any thread.
    virtual void mergeData(std::uintptr_t value) = 0;
};

/// A source of kind timer, on a clock that no setting of the date touches and that goes on while
/// the machine sleeps. To be used on its queue.
///
/// Times that fall due while it is suspended, or while the queue is busy, lead to one call. Its
/// handler is held until `cancel` or until the platform shuts down.
class TimerEventSource : public EventSource {
public:
    /// Falls due `first` from now, and then every `interval`; replaces what was set before.
    /// `leeway` is how much later it may be, so that several timers fall due together.
    virtual void setTimer(std::chrono::nanoseconds first, std::chrono::nanoseconds interval,
                          std::chrono::nanoseconds leeway) = 0;

    /// Calls nothing until `resume`.
    virtual void suspend() = 0;

    /// Ends the source for good and lets its handler go.
    virtual void cancel() = 0;
};

} // namespace nimbra
