#include "device/system/TimerSource.h"

#include <utility>

namespace nimbra::device {

TimerSource::TimerSource(std::shared_ptr<TimerSchedule> schedule, WorkQueue& queue)
    : _schedule(std::move(schedule)), _timer(_schedule->add(queue)) {}

TimerSource::~TimerSource() {
    _schedule->end(*_timer);
}

void TimerSource::setEventHandler(std::function<void()> handler) {
    _schedule->setHandler(*_timer, std::move(handler));
}

void TimerSource::resume() {
    _schedule->resume(*_timer);
}

void TimerSource::setTimer(std::chrono::nanoseconds first, std::chrono::nanoseconds interval,
                           std::chrono::nanoseconds leeway) {
    _schedule->set(*_timer, {.first = first, .interval = interval, .leeway = leeway});
}

void TimerSource::suspend() {
    _schedule->suspend(*_timer);
}

void TimerSource::cancel() {
    _schedule->end(*_timer);
}

} // namespace nimbra::device
