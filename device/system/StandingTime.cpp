#include "device/system/StandingTime.h"

#include <algorithm>
#include <utility>

namespace nimbra::device {

StandingTime::StandingTime(Date start) : _start(start) {}

std::chrono::nanoseconds StandingTime::elapsed() const {
    const std::scoped_lock lock(_mutex);
    return _elapsed;
}

Date StandingTime::now() const {
    const std::scoped_lock lock(_mutex);
    return _start + std::chrono::duration_cast<Date::duration>(_elapsed);
}

void StandingTime::setNow(Date date) {
    const std::scoped_lock lock(_mutex);
    _start = date - std::chrono::duration_cast<Date::duration>(_elapsed);
}

void StandingTime::setWake(std::function<void()> wake) {
    const std::scoped_lock lock(_mutex);
    _wake = std::move(wake);
}

bool StandingTime::wakeAt(std::optional<std::chrono::nanoseconds> deadline) {
    const std::scoped_lock lock(_mutex);
    _deadline = deadline;
    return !deadline || *deadline > _elapsed;
}

std::optional<std::chrono::nanoseconds> StandingTime::nextDeadline() const {
    const std::scoped_lock lock(_mutex);
    return _deadline;
}

void StandingTime::advanceTo(std::chrono::nanoseconds elapsed) {
    std::function<void()> wake;
    {
        const std::scoped_lock lock(_mutex);
        _elapsed = std::max(_elapsed, elapsed);
        if (!_deadline || *_deadline > _elapsed) {
            return;
        }
        wake = _wake;
    }
    if (wake) {
        wake();
    }
}

void StandingTime::advance(std::chrono::nanoseconds duration) {
    advanceTo(elapsed() + duration);
}

} // namespace nimbra::device
