#include "device/apps/DeviceAppTerminator.h"

#include "device/system/DeviceWorkQueues.h"
#include "tests/device/RecordingLog.h"
#include "tests/support/FakeApplicationProcesses.h"
#include "tests/support/PumpedQueue.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using Lines = std::vector<std::string>;

class DeviceAppTerminatorTest : public testing::Test {
protected:
    /// Ends `application` to the end, on a device with two ways of knowing applications.
    void terminate(const std::string& application, const Termination& termination = {}) {
        DeviceAppTerminator::Ways ways;
        ways.push_back(std::make_unique<test::FakeApplicationProcesses>("one", _calls));
        ways.push_back(std::make_unique<test::FakeApplicationProcesses>("two", _calls));
        DeviceAppTerminator terminator(std::move(ways), _queues, _log,
                                       std::chrono::milliseconds(7));
        terminator.terminateApplication(BundleIdentifier(application), termination);
        _queues.finish();
    }

    [[nodiscard]] const Lines& calls() const { return _calls.calls; }
    [[nodiscard]] Lines logged() const { return _log.lines(); }

private:
    test::RecordingLog _log;
    test::ProcessCalls _calls;
    test::PumpedQueue _mainQueue{"main"};
    DeviceWorkQueues _queues{_mainQueue};
};

TEST_F(DeviceAppTerminatorTest, AnApplicationIsKilledWhenItsTimeIsOver) {
    terminate("one");

    EXPECT_EQ(calls(),
              (Lines{"ask one for one on app-termination", "await 7 on app-termination-wait",
                     "kill on app-termination-wait", "await 5000 on app-termination-wait"}));
}

TEST_F(DeviceAppTerminatorTest, TheFirstWayThatKnowsTheApplicationEndsIt) {
    terminate("two");

    ASSERT_EQ(calls().size(), 5U);
    EXPECT_EQ(calls()[0], "ask one for two on app-termination");
    EXPECT_EQ(calls()[1], "ask two for two on app-termination");
}

TEST_F(DeviceAppTerminatorTest, NothingHappensToAnApplicationThatDoesNotRun) {
    terminate("three", {.reason = 3, .report = true});

    EXPECT_EQ(calls(), (Lines{"ask one for three on app-termination",
                              "ask two for three on app-termination"}));
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(DeviceAppTerminatorTest, OnlyTheApplicationsOfThisMachineAreInItsManagersUnits) {
    test::RecordingLog log;

    EXPECT_EQ(DeviceAppTerminator::waysOn(DevicePaths("/"), log).size(), 2U);
    EXPECT_EQ(DeviceAppTerminator::waysOn(DevicePaths("/a/device"), log).size(), 1U);
}

TEST_F(DeviceAppTerminatorTest, OnlyATerminationThatIsToBeReportedIsLogged) {
    terminate("one", {.reason = 3, .report = false, .description = "why"});

    EXPECT_EQ(logged(), Lines{});
}

TEST_F(DeviceAppTerminatorTest, AReportTellsTheReason) {
    terminate("one", {.reason = 3, .report = true, .description = "why"});

    EXPECT_EQ(logged(), Lines{"not an error: Terminated one, reason 3: why"});
}

TEST_F(DeviceAppTerminatorTest, AReportWithoutADescriptionIsShorter) {
    terminate("one", {.reason = 4, .report = true});

    EXPECT_EQ(logged(), Lines{"not an error: Terminated one, reason 4"});
}

} // namespace
} // namespace nimbra::device
