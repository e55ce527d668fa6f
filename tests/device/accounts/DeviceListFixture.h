#pragma once

#include "device/accounts/DeviceListService.h"
#include "device/system/DataOrSource.h"
#include "device/system/StandingTime.h"
#include "device/system/TimerSource.h"
#include "platform/system/WorkQueues.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/FakeAccount.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/TemporaryDirectory.h"

#include <chrono>
#include <gtest/gtest.h>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

using Names = std::vector<std::string>;

/// Queues that a test pumps, with timers over a time that stands until a test moves it.
class TimedQueues final : public WorkQueues {
public:
    [[nodiscard]] PumpedQueue& mainQueue() override { return _mainQueue; }
    [[nodiscard]] std::shared_ptr<WorkQueue>
    serialQueueWithLabel(const std::string& label) override {
        return queues.emplace_back(std::make_shared<PumpedQueue>(label));
    }
    [[nodiscard]] PumpedQueue& globalQueueWithQuality(QualityClass /*quality*/) override {
        return _globalQueue;
    }
    [[nodiscard]] std::shared_ptr<DataOrEventSource>
    dataOrSourceOnQueue(std::shared_ptr<WorkQueue> queue) override {
        return std::make_shared<device::DataOrSource>(std::move(queue));
    }
    [[nodiscard]] std::shared_ptr<TimerEventSource> timerSourceOnQueue(WorkQueue& queue) override {
        return std::make_shared<device::TimerSource>(_schedule, queue);
    }

    /// Those that were made, in order.
    std::vector<std::shared_ptr<PumpedQueue>> queues;
    std::shared_ptr<device::StandingTime> time =
        std::make_shared<device::StandingTime>(Date(std::chrono::hours(400'000)));

private:
    PumpedQueue _mainQueue{"main"};
    PumpedQueue _globalQueue{"global"};
    std::shared_ptr<device::TimerSchedule> _schedule = device::TimerSchedule::over(time);
};

/// A service over the file of a device, and what it has answered.
struct DeviceListFixture : testing::Test {
    TemporaryDirectory directory;
    RecordingLog log;
    TimedQueues queues;
    std::optional<device::DeviceListService> service;
    std::shared_ptr<FakeAccount> account = std::make_shared<FakeAccount>("primary");
    /// The answers that have come, in order.
    std::vector<std::optional<DeviceListResponse>> answers;

    DeviceListFixture() {
        service.emplace(device::DeviceListFile(device::DevicePaths(directory.path()), log), queues);
    }

    [[nodiscard]] std::filesystem::path path() const {
        return directory.path() / "var/lib/nimbra/device-list.json";
    }
    void write(const std::string& text) const { writeTestFile(path(), text); }
    void write(const Names& incompatible, const Names& needUpgrade) const {
        write(nlohmann::json{{"incompatible", incompatible}, {"needUpgrade", needUpgrade}}.dump());
    }

    /// A handler that notes the answer, and holds `held` until it is let go.
    [[nodiscard]] DeviceListRequest::Handler noting(std::shared_ptr<int> held = nullptr) {
        return [this, held = std::move(held)](const DeviceListRequest& /*request*/,
                                              const std::optional<DeviceListResponse>& response) {
            answers.push_back(response);
        };
    }
    void ask(std::shared_ptr<int> held = nullptr) {
        service->initWithAccount(account)->performRequestWithHandler(noting(std::move(held)));
    }
    void pump() const {
        for (const auto& queue : queues.queues) {
            queue->pump();
        }
    }
    void advance(std::chrono::nanoseconds duration) const {
        queues.time->advance(duration);
        pump();
    }

    static Names namesOf(const std::optional<std::vector<Text>>& texts) {
        Names names;
        for (const Text& text : texts.value()) {
            names.push_back(text.string());
        }
        return names;
    }
    /// The names of the answer that came last, which has both lists.
    [[nodiscard]] Names incompatible() const {
        return namesOf(answers.back().value().incompatibleDeviceNames);
    }
    [[nodiscard]] Names needUpgrade() const {
        return namesOf(answers.back().value().needUpgradeDeviceNames);
    }
};

} // namespace nimbra::test
