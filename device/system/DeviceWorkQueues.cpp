#include "device/system/DeviceWorkQueues.h"

#include "device/system/ConcurrentQueue.h"
#include "device/system/DataOrSource.h"
#include "device/system/MachineTime.h"
#include "device/system/SerialQueue.h"
#include "device/system/ThreadName.h"
#include "device/system/TimerSchedule.h"
#include "device/system/TimerSource.h"

#include <algorithm>
#include <condition_variable>
#include <cstddef>
#include <cstdlib>
#include <future>
#include <iostream>
#include <list>
#include <mutex>
#include <thread>
#include <utility>

namespace nimbra::device {

namespace {

/// Queues `work` and waits until it has run.
void runAndWait(WorkQueue& queue, WorkQueue::Work work) {
    std::promise<void> ran;
    const std::future<void> end = ran.get_future();
    queue.async([work = std::move(work), ran = std::move(ran)]() mutable {
        work();
        // Who waits may rely on it that nothing of the work is left.
        work = nullptr;
        ran.set_value();
    });
    end.wait();
}

} // namespace

/// What the queues and their maker share: the threads, and how much work there is.
class DeviceWorkQueues::Shared {
public:
    Shared() : _globalQueue("user-initiated", [this] { workEnded(); }) {}

    [[nodiscard]] ConcurrentQueue& globalQueue() { return _globalQueue; }

    /// A new queue with a thread of its own: a queue that waits for another never keeps a third
    /// one from running.
    std::shared_ptr<SerialQueue> addQueue(const std::string& label) {
        auto queue = std::make_shared<SerialQueue>(label, [this] { workEnded(); });
        const std::scoped_lock lock(_mutex);
        joinEnded();
        Thread& thread = _threads.emplace_back();
        thread.queue = queue;
        thread.thread = std::thread([this, queue, &thread] {
            nameCurrentThread(queue->label());
            queue->run();
            const std::scoped_lock threadLock(_mutex);
            thread.ended = true;
        });
        return queue;
    }

    /// Puts `work` behind what `queue` has; once the threads have ended it is dropped.
    template <class Queue>
    void add(Queue& queue, WorkQueue::Work work) {
        {
            const std::scoped_lock lock(_mutex);
            ++_unfinished;
        }
        if (!queue.add(work)) {
            workEnded();
        }
    }

    [[nodiscard]] bool isIdle() const {
        const std::scoped_lock lock(_mutex);
        return _unfinished == 0;
    }

    void setIdleObserver(std::function<void()> observer) {
        const std::scoped_lock lock(_mutex);
        _idleObserver = std::make_shared<std::function<void()>>(std::move(observer));
    }

    /// Waits until nothing is queued anywhere, as work may queue more work on another queue, then
    /// ends the threads.
    void finish() {
        {
            std::unique_lock lock(_mutex);
            _idle.wait(lock, [this] { return _unfinished == 0; });
        }
        for (Thread& thread : _threads) {
            thread.queue->close();
            thread.thread.join();
        }
        _threads.clear();
        _globalQueue.finish();
    }

private:
    struct Thread {
        std::shared_ptr<SerialQueue> queue;
        std::thread thread;
        bool ended = false;
    };

    void workEnded() {
        std::shared_ptr<std::function<void()>> observer;
        {
            const std::scoped_lock lock(_mutex);
            if (--_unfinished > 0) {
                return;
            }
            observer = _idleObserver;
            _idle.notify_all();
        }
        if (observer && *observer) {
            (*observer)();
        }
    }

    /// Joins the threads whose queue was let go and has run dry.
    void joinEnded() {
        std::erase_if(_threads, [](Thread& thread) {
            if (thread.ended) {
                thread.thread.join();
            }
            return thread.ended;
        });
    }

    mutable std::mutex _mutex;
    std::condition_variable _idle;
    std::list<Thread> _threads;
    std::size_t _unfinished = 0;
    std::shared_ptr<std::function<void()>> _idleObserver;
    /// Last: its threads, which use the others, end before those go.
    ConcurrentQueue _globalQueue;
};

/// One serial queue as its owners hold it.
class DeviceWorkQueues::Queue final : public WorkQueue {
public:
    Queue(std::shared_ptr<Shared> shared, const std::string& label)
        : _shared(std::move(shared)), _queue(_shared->addQueue(label)) {}
    Queue(const Queue&) = delete;
    Queue& operator=(const Queue&) = delete;
    ~Queue() override { _queue->close(); }

    [[nodiscard]] const std::string& label() const override { return _queue->label(); }

    void async(Work work) override { _shared->add(*_queue, std::move(work)); }

    void sync(Work work) override {
        if (_queue->isCurrent()) {
            std::cerr << "nimbra: the queue \"" << label() << "\" waits for itself\n";
            std::abort();
        }
        runAndWait(*this, std::move(work));
    }

private:
    std::shared_ptr<Shared> _shared;
    std::shared_ptr<SerialQueue> _queue;
};

/// The queue that everybody shares.
class DeviceWorkQueues::GlobalQueue final : public WorkQueue {
public:
    explicit GlobalQueue(std::shared_ptr<Shared> shared) : _shared(std::move(shared)) {}

    [[nodiscard]] const std::string& label() const override {
        return _shared->globalQueue().label();
    }
    void async(Work work) override { _shared->add(_shared->globalQueue(), std::move(work)); }
    // Also from itself: another thread runs the work.
    void sync(Work work) override { runAndWait(*this, std::move(work)); }

private:
    std::shared_ptr<Shared> _shared;
};

DeviceWorkQueues::DeviceWorkQueues(WorkQueue& mainQueue, std::shared_ptr<TimeSource> timeSource)
    : _shared(std::make_shared<Shared>()), _globalQueue(std::make_unique<GlobalQueue>(_shared)),
      _timeSource(timeSource ? std::move(timeSource) : std::make_shared<MachineTime>()),
      _timers(TimerSchedule::over(_timeSource)), _mainQueue(mainQueue) {}

DeviceWorkQueues::~DeviceWorkQueues() {
    finish();
}

void DeviceWorkQueues::finish() {
    // First: what the handlers held may queue work when it goes.
    _timers->finish();
    _shared->finish();
}

WorkQueue& DeviceWorkQueues::mainQueue() {
    return _mainQueue;
}

std::shared_ptr<WorkQueue> DeviceWorkQueues::serialQueueWithLabel(const std::string& label) {
    return std::make_shared<Queue>(_shared, label);
}

WorkQueue& DeviceWorkQueues::globalQueueWithQuality(QualityClass /*quality*/) {
    return *_globalQueue;
}

std::shared_ptr<DataOrEventSource>
DeviceWorkQueues::dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) {
    return std::make_shared<DataOrSource>(std::move(queue));
}

std::shared_ptr<TimerEventSource> DeviceWorkQueues::timerSourceOnQueue(WorkQueue& queue) {
    return std::make_shared<TimerSource>(_timers, queue);
}

std::shared_ptr<const TimeSource> DeviceWorkQueues::timeSource() const {
    return _timeSource;
}

bool DeviceWorkQueues::isIdle() const {
    return _shared->isIdle();
}

void DeviceWorkQueues::setIdleObserver(std::function<void()> observer) {
    _shared->setIdleObserver(std::move(observer));
}

} // namespace nimbra::device
