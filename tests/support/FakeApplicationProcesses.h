#pragma once

#include "device/apps/ApplicationProcesses.h"
#include "device/system/CurrentQueue.h"

#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// What happened to applications that no process stands behind. Any thread.
struct ProcessCalls {
    void add(const std::string& call) {
        const std::scoped_lock lock(mutex);
        calls.push_back(call + " on " + device::currentQueueLabel());
    }

    std::mutex mutex;
    std::vector<std::string> calls;
};

/// Knows one application, which ends when it is killed.
class FakeApplicationProcesses final : public device::ApplicationProcesses {
public:
    /// `calls` is not owned and outlives this object and what it gives.
    FakeApplicationProcesses(std::string application, ProcessCalls& calls)
        : _application(std::move(application)), _calls(calls) {}

    [[nodiscard]] std::unique_ptr<device::EndingApplication>
    askToEnd(const BundleIdentifier& application) override {
        _calls.add("ask " + _application + " for " + application.string());
        return application.string() == _application ? std::make_unique<Ending>(_calls) : nullptr;
    }

private:
    class Ending final : public device::EndingApplication {
    public:
        explicit Ending(ProcessCalls& calls) : _calls(calls) {}

        [[nodiscard]] bool awaitEnd(std::chrono::milliseconds longest) override {
            _calls.add("await " + std::to_string(longest.count()));
            return _isKilled;
        }
        void kill() override {
            _calls.add("kill");
            _isKilled = true;
        }

    private:
        ProcessCalls& _calls;
        bool _isKilled = false;
    };

    std::string _application;
    ProcessCalls& _calls;
};

} // namespace nimbra::test
