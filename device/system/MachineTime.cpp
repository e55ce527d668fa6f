#include "device/system/MachineTime.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <pthread.h>
#include <sys/timerfd.h>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

// Not the monotonic clock, which stands while the machine sleeps.
constexpr clockid_t clockOfTimers = CLOCK_BOOTTIME;

/// Without its clock the platform cannot work.
[[noreturn]] void failBecause(const char* what) {
    std::perror(what);
    std::abort();
}

} // namespace

MachineTime::~MachineTime() {
    end();
}

std::chrono::nanoseconds MachineTime::elapsed() const {
    timespec time{};
    if (::clock_gettime(clockOfTimers, &time) != 0) {
        failBecause("the time cannot be read: clock_gettime");
    }
    return std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec);
}

Date MachineTime::now() const {
    return std::chrono::floor<Date::duration>(std::chrono::system_clock::now());
}

void MachineTime::setWake(std::function<void()> wake) {
    if (!wake) {
        end();
    }
    const std::scoped_lock lock(_mutex);
    _wake = std::move(wake);
}

bool MachineTime::wakeAt(std::optional<std::chrono::nanoseconds> deadline) {
    const std::scoped_lock lock(_mutex);
    if (_isEnding || (!deadline && !_thread.joinable())) {
        return true;
    }
    if (!_thread.joinable()) {
        start();
    }
    // Zero would mean none; a deadline that has passed comes at once.
    constexpr std::chrono::nanoseconds earliest{1};
    set(deadline ? std::max(*deadline, earliest) : std::chrono::nanoseconds::zero());
    return true;
}

void MachineTime::start() {
    _timer.emplace(::timerfd_create(clockOfTimers, TFD_CLOEXEC));
    if (!_timer->isOpen()) {
        failBecause("the timers cannot be made: timerfd_create");
    }
    _thread = std::thread([this] {
        ::pthread_setname_np(::pthread_self(), "timers");
        run();
    });
}

void MachineTime::end() {
    {
        const std::scoped_lock lock(_mutex);
        if (!_thread.joinable()) {
            return;
        }
        _isEnding = true;
        set(std::chrono::nanoseconds(1));
    }
    _thread.join();
    const std::scoped_lock lock(_mutex);
    _timer.reset();
    _isEnding = false;
}

void MachineTime::run() {
    while (true) {
        std::uint64_t expirations = 0;
        if (::read(_timer->number(), &expirations, sizeof expirations) < 0) {
            if (errno != EINTR) {
                failBecause("the timers cannot be waited for: read");
            }
            continue;
        }
        std::function<void()> wake;
        {
            const std::scoped_lock lock(_mutex);
            if (_isEnding) {
                return;
            }
            wake = _wake;
        }
        if (wake) {
            wake();
        }
    }
}

void MachineTime::set(std::chrono::nanoseconds deadline) const {
    const auto wholeSeconds = std::chrono::floor<std::chrono::seconds>(deadline);
    itimerspec setting{};
    setting.it_value.tv_sec = wholeSeconds.count();
    setting.it_value.tv_nsec = (deadline - wholeSeconds).count();
    if (::timerfd_settime(_timer->number(), TFD_TIMER_ABSTIME, &setting, nullptr) != 0) {
        failBecause("a timer cannot be set: timerfd_settime");
    }
}

} // namespace nimbra::device
