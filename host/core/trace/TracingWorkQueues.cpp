#include "host/core/trace/TracingWorkQueues.h"

#include "host/core/trace/Trace.h"

#include <cstdint>
#include <utility>

namespace nimbra::host {

namespace {

/// Whole seconds as an integer, for they read better.
nlohmann::ordered_json secondsOf(std::chrono::nanoseconds duration) {
    const auto whole = std::chrono::duration_cast<std::chrono::seconds>(duration);
    if (whole == duration) {
        return static_cast<std::int64_t>(whole.count());
    }
    return std::chrono::duration<double>(duration).count();
}

class TracingTimer final : public TimerEventSource {
public:
    TracingTimer(std::shared_ptr<TimerEventSource> timer, Trace& trace)
        : _timer(std::move(timer)), _trace(trace) {}

    void setEventHandler(std::function<void()> handler) override {
        _timer->setEventHandler([handler = std::move(handler), &trace = _trace] {
            trace.write("timer", {{"op", "fire"}});
            if (handler) {
                handler();
            }
        });
    }
    void resume() override {
        write("resume");
        _timer->resume();
    }
    void setTimer(std::chrono::nanoseconds first, std::chrono::nanoseconds interval,
                  std::chrono::nanoseconds leeway) override {
        _trace.write(
            "timer",
            {{"op", "arm"}, {"first", secondsOf(first)}, {"interval", secondsOf(interval)}});
        _timer->setTimer(first, interval, leeway);
    }
    void suspend() override {
        write("suspend");
        _timer->suspend();
    }
    void cancel() override {
        write("cancel");
        _timer->cancel();
    }

private:
    void write(const char* operation) { _trace.write("timer", {{"op", operation}}); }

    std::shared_ptr<TimerEventSource> _timer;
    Trace& _trace;
};

} // namespace

WorkQueue& TracingWorkQueues::mainQueue() {
    return _queues.mainQueue();
}

std::shared_ptr<WorkQueue> TracingWorkQueues::serialQueueWithLabel(const std::string& label) {
    return _queues.serialQueueWithLabel(label);
}

WorkQueue& TracingWorkQueues::globalQueueWithQuality(QualityClass quality) {
    return _queues.globalQueueWithQuality(quality);
}

std::shared_ptr<DataOrEventSource>
TracingWorkQueues::dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) {
    return _queues.dataOrSourceOnQueue(std::move(queue));
}

std::shared_ptr<TimerEventSource> TracingWorkQueues::timerSourceOnQueue(WorkQueue& queue) {
    return std::make_shared<TracingTimer>(_queues.timerSourceOnQueue(queue), _trace);
}

} // namespace nimbra::host
