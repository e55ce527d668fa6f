#include "host/core/HostLoop.h"

#include "device/system/CurrentQueue.h"
#include "device/system/DeviceWorkQueues.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <future>
#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>
#include <utility>

namespace nimbra::host {

/// A signal that stays until it is taken back, and that `poll` can wait for.
class HostLoop::WakeUp {
public:
    WakeUp() : _descriptor(::eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {
        if (_descriptor < 0) {
            std::perror("the main queue cannot be made: eventfd");
            std::abort();
        }
    }
    WakeUp(const WakeUp&) = delete;
    WakeUp& operator=(const WakeUp&) = delete;
    ~WakeUp() { ::close(_descriptor); }

    [[nodiscard]] int descriptor() const { return _descriptor; }

    void signal() const {
        // A full counter is a signal, too: nothing can fail here that matters.
        static_cast<void>(::eventfd_write(_descriptor, 1));
    }
    void takeBack() const {
        eventfd_t count = 0;
        static_cast<void>(::eventfd_read(_descriptor, &count));
    }
    void wait() const {
        pollfd descriptor{.fd = _descriptor, .events = POLLIN, .revents = 0};
        static_cast<void>(::poll(&descriptor, 1, -1));
    }

private:
    int _descriptor;
};

HostLoop::HostLoop() : _thread(std::this_thread::get_id()), _wakeUp(std::make_shared<WakeUp>()) {}

HostLoop::~HostLoop() {
    while (runPending()) {
    }
}

const std::string& HostLoop::label() const {
    static const std::string main = "main";
    return main;
}

void HostLoop::async(Work work) {
    {
        const std::scoped_lock lock(_mutex);
        _pending.push_back(std::move(work));
        ++_queued;
    }
    _wakeUp->signal();
}

void HostLoop::sync(Work work) {
    if (std::this_thread::get_id() == _thread) {
        std::fputs("programming error: the main queue waits for itself\n", stderr);
        std::abort();
    }
    std::promise<void> done;
    const std::future<void> end = done.get_future();
    async([&work, &done] {
        work();
        work = nullptr;
        done.set_value();
    });
    end.wait();
}

int HostLoop::wakeUpDescriptor() const {
    return _wakeUp->descriptor();
}

bool HostLoop::runPending() {
    // Taken back first: work that comes from here on signals again.
    _wakeUp->takeBack();
    std::deque<Work> work;
    {
        const std::scoped_lock lock(_mutex);
        work.swap(_pending);
    }
    const device::CurrentQueueScope scope(label());
    const bool hadWork = !work.empty();
    _turnObserver();
    while (!work.empty()) {
        Work piece = std::move(work.front());
        work.pop_front();
        piece();
        piece = nullptr;
        _turnObserver();
        const std::scoped_lock lock(_mutex);
        ++_ended;
    }
    return hadWork;
}

void HostLoop::follow(device::DeviceWorkQueues& queues) {
    queues.setIdleObserver([wakeUp = _wakeUp] { wakeUp->signal(); });
}

bool HostLoop::isIdle(const device::DeviceWorkQueues& queues) const {
    std::size_t before = 0;
    {
        const std::scoped_lock lock(_mutex);
        before = _queued;
        if (_ended != _queued) {
            return false;
        }
    }
    if (!queues.isIdle()) {
        return false;
    }
    // Where nothing has come since, nothing ran here while the queues were found idle.
    const std::scoped_lock lock(_mutex);
    return _queued == before;
}

void HostLoop::runUntilIdle(device::DeviceWorkQueues& queues) {
    follow(queues);
    while (true) {
        if (runPending()) {
            continue;
        }
        // In this order: background work hands over before it ends, so once the queues are idle
        // nothing more can come. A signal since `runPending` ends the wait at once.
        if (queues.isIdle() && isEmpty()) {
            break;
        }
        _wakeUp->wait();
    }
}

bool HostLoop::isEmpty() const {
    const std::scoped_lock lock(_mutex);
    return _pending.empty();
}

} // namespace nimbra::host
