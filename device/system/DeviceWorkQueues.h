#pragma once

#include "platform/system/WorkQueues.h"

#include <functional>
#include <memory>
#include <string>

namespace nimbra::device {

class TimeSource;
class TimerSchedule;

/// Queues on the platform's threads, beside the main queue that the host's loop runs. Any thread.
/// A serial queue has a thread of its own. Any number of pieces of work of a global queue may be
/// under way at once, each on its thread, so it may wait for work of its own.
/// A serial queue may outlive the threads, but then drops what is queued to it. A timer that waits
/// for its time is no work to do.
class DeviceWorkQueues final : public WorkQueues {
public:
    /// `mainQueue` is not owned and outlives the queues. The timers run by `timeSource`, which is
    /// no other platform's; by the machine's own time where none is given.
    explicit DeviceWorkQueues(WorkQueue& mainQueue,
                              std::shared_ptr<TimeSource> timeSource = nullptr);
    /// Ends the threads as `finish` does.
    ~DeviceWorkQueues() override;

    /// Ends the timers and lets their handlers go on the calling thread, runs what is still queued,
    /// and what that queues, then ends the threads. Not on one of them.
    void finish();

    [[nodiscard]] WorkQueue& mainQueue() override;
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override;
    /// The queue "user-initiated", which goes with this object.
    [[nodiscard]] WorkQueue& globalQueueWithQuality(QualityClass quality) override;
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override;
    [[nodiscard]] std::shared_ptr<TimerEventSource> timerSourceOnQueue(WorkQueue& queue) override;

    /// What the timers run by.
    [[nodiscard]] std::shared_ptr<const TimeSource> timeSource() const;

    /// Whether no background queue has work that is queued or under way.
    [[nodiscard]] bool isIdle() const;
    /// Calls `observer`, on the thread that ended the last piece of work, each time the queues
    /// become idle. An empty one ends it; a call that has begun runs to its end.
    void setIdleObserver(std::function<void()> observer);

private:
    class Shared;
    class Queue;
    class GlobalQueue;

    std::shared_ptr<Shared> _shared;
    std::unique_ptr<WorkQueue> _globalQueue;
    std::shared_ptr<TimeSource> _timeSource;
    std::shared_ptr<TimerSchedule> _timers;
    WorkQueue& _mainQueue;
};

} // namespace nimbra::device
