#pragma once

#include "platform/system/EventSource.h"

#include <chrono>
#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// A timer that falls due when a test says so, and writes down what is asked of it.
class FakeTimer final : public TimerEventSource {
public:
    /// What was asked, in order: "arm 2/60" (seconds), "resume", "suspend", "cancel".
    std::vector<std::string> calls;
    std::chrono::nanoseconds leeway{-1};

    void setEventHandler(std::function<void()> handler) override { _handler = std::move(handler); }
    void resume() override {
        calls.emplace_back("resume");
        _isResumed = true;
    }
    void setTimer(std::chrono::nanoseconds first, std::chrono::nanoseconds interval,
                  std::chrono::nanoseconds given) override {
        using Seconds = std::chrono::duration<double>;
        std::string call = "arm " + std::to_string(Seconds(first).count());
        call += '/' + std::to_string(Seconds(interval).count());
        calls.push_back(std::move(call));
        leeway = given;
    }
    void suspend() override {
        calls.emplace_back("suspend");
        _isResumed = false;
    }
    void cancel() override {
        calls.emplace_back("cancel");
        _handler = {};
    }

    /// Falls due: calls the handler unless the timer is suspended or cancelled.
    void fire() const {
        if (_isResumed && _handler) {
            _handler();
        }
    }

private:
    std::function<void()> _handler;
    bool _isResumed = false;
};

} // namespace nimbra::test
