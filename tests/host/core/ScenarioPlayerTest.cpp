#include "host/core/scenario/ScenarioPlayer.h"

#include "device/DeviceDirectory.h"
#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/files/Files.h"
#include "device/system/StandingTime.h"
#include "host/core/PaneSession.h"
#include "host/core/scenario/RunningApplications.h"
#include "host/core/scenario/ScenarioReader.h"
#include "host/core/trace/Trace.h"
#include "tests/support/TemporaryDirectory.h"

#include <chrono>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

class ScenarioPlayerTest : public testing::Test {
protected:
    /// What a scenario is played with, up to its first step. Its lines go to `lines`.
    struct Prepared {
        Scenario scenario;
        std::shared_ptr<device::StandingTime> time;
        std::unique_ptr<PaneSession> session;
    };
    std::unique_ptr<Prepared> prepare(const std::string& text) {
        auto scenario = readScenario(text, "scenario");
        EXPECT_TRUE(scenario) << scenario.error();
        EXPECT_TRUE(device::createDeviceDirectory(root(), scenario->device.description));
        auto time = std::make_shared<device::StandingTime>(scenario->device.description.now);
        auto session = PaneSession::start(
            {.root = root(), .bundle = NIMBRA_PANE_BUNDLE, .trace = &trace, .timeSource = time});
        EXPECT_TRUE(session) << session.error();
        return std::make_unique<Prepared>(std::move(*scenario), std::move(time),
                                          std::move(*session));
    }
    ScenarioPlayer playerOf(const Prepared& prepared, RunningApplications& applications) {
        return {prepared.scenario, *prepared.session, applications, *prepared.time, trace};
    }
    /// Plays these steps on a device without applications; those that come run where
    /// `applications` says.
    std::expected<void, StepFailure> play(RunningApplications& applications,
                                          const std::string& steps) {
        const auto prepared = prepare(R"({"steps": [)" + steps + "]}");
        return playerOf(*prepared, applications).play();
    }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::filesystem::path elsewhere() const { return _directory.path(); }
    [[nodiscard]] bool isRecorded(const std::string& application) const {
        return std::filesystem::exists(root() / "run/nimbra" / (application + ".pid"));
    }

    std::vector<std::string> lines;
    Trace trace{[this](const std::string& line) { lines.push_back(line); }};

private:
    test::TemporaryDirectory _directory;
};

TEST_F(ScenarioPlayerTest, AChangeOfTheApplicationsStartsAndEndsThem) {
    RunningApplications applications(root());

    ASSERT_TRUE(play(applications, R"(
        {"do": "change", "device": {"apps": [{"identifier": "a", "running": true},
                                             {"identifier": "b", "running": true}]}},
        {"do": "change", "device": {"apps": [{"identifier": "a"},
                                             {"identifier": "b", "running": true},
                                             {"identifier": "c", "running": true}]}})"));

    EXPECT_FALSE(isRecorded("a"));
    EXPECT_TRUE(isRecorded("b"));
    EXPECT_TRUE(isRecorded("c"));
}

TEST_F(ScenarioPlayerTest, AChangeOfSomethingElseLeavesTheApplicationsRunning) {
    RunningApplications applications(root());

    ASSERT_TRUE(play(applications, R"(
        {"do": "change", "device": {"apps": [{"identifier": "a", "running": true}]}},
        {"do": "change", "device": {"name": "Other"}})"));

    EXPECT_TRUE(isRecorded("a"));
}

TEST_F(ScenarioPlayerTest, AnApplicationThatCannotBeStartedFailsTheStep) {
    std::ofstream(elsewhere() / "run") << "a file";
    RunningApplications applications(elsewhere());

    const auto played = play(applications, R"(
        {"do": "open"},
        {"do": "change", "device": {"apps": [{"identifier": "a", "running": true}]}})");

    ASSERT_FALSE(played);
    EXPECT_EQ(played.error().index, 1U);
    EXPECT_EQ(played.error().reason,
              (elsewhere() / "run/nimbra").string() + ": cannot be made: Not a directory");
}

TEST_F(ScenarioPlayerTest, AStepOfItsOwnWaitsForNothing) {
    const auto prepared =
        prepare(R"({"device": {"accounts": [{"identifier": "primary", "usesStratafile": true,
                                             "enabled": ["kAccountDataclassTidewater"]}]},
                    "steps": [{"do": "open"}, {"do": "set", "row": "Nimbra Drive",
                                               "value": false}]})");
    PaneSession& session = *prepared->session;
    RunningApplications applications(root());
    ScenarioPlayer player = playerOf(*prepared, applications);

    player.begin();
    ASSERT_TRUE(player.hasNext());
    ASSERT_TRUE(player.performNext());
    ASSERT_TRUE(player.hasNext());
    ASSERT_TRUE(player.performNext());

    EXPECT_FALSE(player.hasNext());
    // The save is yet to be told of.
    EXPECT_FALSE(session.isSettled());
    session.settle();
    EXPECT_TRUE(session.isSettled());
    player.end();
    const auto written = lines.size();
    session.closePane();
    EXPECT_EQ(lines.size(), written);
}

TEST_F(ScenarioPlayerTest, NoStepIsLeftAfterOneThatCannotBeDone) {
    const auto prepared = prepare(R"({"steps": [{"do": "list"}, {"do": "open"}]})");
    RunningApplications applications(root());
    ScenarioPlayer player = playerOf(*prepared, applications);
    player.begin();

    const auto done = player.performNext();

    ASSERT_FALSE(done);
    EXPECT_EQ(done.error().index, 0U);
    EXPECT_EQ(done.error().name, "list");
    EXPECT_EQ(done.error().reason, "no page is open");
    EXPECT_FALSE(player.hasNext());
    EXPECT_FALSE(prepared->session->isPaneOpen());
}

TEST(ScenarioReading, AShareStepSaysHowTheUserLeavesTheSheet) {
    const auto scenario = readScenario(R"({"steps": [{"do": "share", "outcome": "sent"},
                                                     {"do": "share", "outcome": "cancelled"},
                                                     {"do": "share", "outcome": "failed"}]})",
                                       "scenario");
    ASSERT_TRUE(scenario) << scenario.error();

    std::vector<ShareOutcome> outcomes;
    for (const ScenarioStep& step : scenario->steps) {
        outcomes.push_back(std::get<ShareArguments>(step.arguments).outcome);
    }

    EXPECT_EQ(outcomes,
              (std::vector{ShareOutcome::sent, ShareOutcome::cancelled, ShareOutcome::failed}));
}

} // namespace
} // namespace nimbra::host
