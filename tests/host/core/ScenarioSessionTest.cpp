#include "host/core/scenario/ScenarioSession.h"

#include "device/files/Files.h"
#include "host/core/PaneSession.h"
#include "host/core/trace/Trace.h"
#include "tests/device/TestFiles.h"
#include "tests/host/SampleScenarios.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <poll.h>
#include <string>

namespace nimbra::host {
namespace {

const std::filesystem::path samples = test::sampleScenarios();

/// Runs the main queue as a window does: when it wakes up, until nothing is left to do.
void settleByWakingUp(PaneSession& session) {
    constexpr int farTooLong = 60'000;
    session.runPending();
    while (!session.isSettled()) {
        pollfd work{.fd = session.loop().wakeUpDescriptor(), .events = POLLIN, .revents = 0};
        ASSERT_EQ(::poll(&work, 1, farTooLong), 1) << "nobody woke the main queue up";
        session.runPending();
    }
}

class SteppedSamples : public testing::TestWithParam<std::string> {};

TEST_P(SteppedSamples, TraceAsWhenTheyAreJustPlayed) {
    const auto expected = device::readFile(samples / (GetParam() + ".trace"));
    ASSERT_TRUE(expected) << expected.error();
    std::string lines;
    Trace trace([&lines](const std::string& line) { lines += line + '\n'; });
    const auto prepared =
        ScenarioSession::prepare({.file = samples / (GetParam() + ".json")}, trace);
    ASSERT_TRUE(prepared) << prepared.error();
    ScenarioPlayer& player = (*prepared)->player();

    player.begin();
    while (player.hasNext()) {
        const auto done = player.performNext();
        ASSERT_TRUE(done) << done.error().reason;
        ASSERT_NO_FATAL_FAILURE(settleByWakingUp((*prepared)->session()));
    }
    player.end();

    EXPECT_EQ(lines, *expected);
}

INSTANTIATE_TEST_SUITE_P(All, SteppedSamples, testing::ValuesIn(test::namesOfSampleScenarios()),
                         test::testNameOf);

class ScenarioSessionTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path write(const std::string& scenario) const {
        test::writeTestFile(path("scenario.json"), scenario);
        return path("scenario.json");
    }
    [[nodiscard]] std::filesystem::path path(const std::string& name) const {
        return _directory.path() / name;
    }

    Trace trace{[](const std::string&) {}};

private:
    test::TemporaryDirectory _directory;
};

TEST_F(ScenarioSessionTest, ItsDeviceGoesWithIt) {
    auto prepared = ScenarioSession::prepare({.file = write(R"({"steps": []})")}, trace);
    ASSERT_TRUE(prepared) << prepared.error();
    const std::filesystem::path root = (*prepared)->session().root();
    ASSERT_TRUE(std::filesystem::exists(root));

    prepared->reset();

    EXPECT_FALSE(std::filesystem::exists(root));
    EXPECT_FALSE(std::filesystem::exists(root.parent_path()));
}

TEST_F(ScenarioSessionTest, ADeviceThatIsKeptStaysButNothingRunsOnIt) {
    const auto file = write(R"({"device": {"apps": [{"identifier": "notes", "running": true}]},
                                "steps": []})");
    auto prepared = ScenarioSession::prepare({.file = file, .keep = path("kept")}, trace);
    ASSERT_TRUE(prepared) << prepared.error();
    ASSERT_EQ((*prepared)->session().root(), path("kept"));
    ASSERT_TRUE(std::filesystem::exists(path("kept/run/nimbra/notes.pid")));

    prepared->reset();

    EXPECT_TRUE(std::filesystem::exists(path("kept")));
    EXPECT_FALSE(std::filesystem::exists(path("kept/run/nimbra/notes.pid")));
}

TEST_F(ScenarioSessionTest, AFileThatIsNotThereIsNamed) {
    const auto prepared = ScenarioSession::prepare({.file = path("missing.json")}, trace);

    ASSERT_FALSE(prepared);
    EXPECT_TRUE(prepared.error().description.starts_with(path("missing.json").string() + ": "))
        << prepared.error();
}

TEST_F(ScenarioSessionTest, ADirectoryInUseIsLeftAsItIs) {
    test::writeTestFile(path("kept/letter"), "dear");

    const auto prepared =
        ScenarioSession::prepare({.file = write(R"({"steps": []})"), .keep = path("kept")}, trace);

    ASSERT_FALSE(prepared);
    EXPECT_NE(prepared.error().description.find(path("kept").string()), std::string::npos)
        << prepared.error();
    EXPECT_EQ(device::readFile(path("kept/letter")), "dear");
}

} // namespace
} // namespace nimbra::host
