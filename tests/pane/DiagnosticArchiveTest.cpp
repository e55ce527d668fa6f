#include "platform/system/Clock.h"
#include "platform/system/DeviceInfo.h"
#include "tests/pane/PaneFixture.h"

#include <cerrno>
#include <chrono>
#include <fcntl.h>
#include <gmock/gmock.h>

namespace nimbra::test {
namespace {

using testing::ElementsAre;

constexpr const char* kDirectory =
    "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/Stratafile/";
const Error kFull{"disk", 28, "no room"};
const Error kNothingThere{PlatformErrorDomain, FileNoSuchFileError, "nothing there"};

struct DiagnosticArchive : PaneFixture {
    DiagnosticArchive() { platform.clock.date = Date(std::chrono::seconds(5)); }

    [[nodiscard]] const Calls& calls() const { return platform.calls; }
    [[nodiscard]] FakeSystemLog::Lines lines() const { return platform.systemLog.lines; }
    [[nodiscard]] static std::string path(const std::string& name) { return kDirectory + name; }

    const std::string remove = std::string("remove ") + kDirectory;
    const std::string createParent =
        "create /var/mobile/Library/Logs/CrashReporter/DiagnosticLogs and those above";
    const std::string create = std::string("create ") + kDirectory + " for 511";
    const std::string archive = path("stratafile-Phone-yy.MM.dd-HH.mm.ss@5.tar.gz");
    const FakeSystemLog::Lines full{
        {LogLevel::error, "error creating diagnose dir: no room (disk 28)"}};
};

TEST_F(DiagnosticArchive, ANameLosesWhatAFileNameShouldNotHave) {
    const auto sanitized = &PaneWithRows::_sanitizeForDiagnoseName;

    EXPECT_EQ(sanitized("My Pad / 2"), "My_Pad_:_2");
    EXPECT_EQ(sanitized("Lab’s Pad"), "Lab's_Pad");
    EXPECT_EQ(sanitized("a/\"b\"`c’ d"), "a:'b''c'_d");
    EXPECT_EQ(sanitized("//  \"\"``’’"), "::__''''''");
}

TEST_F(DiagnosticArchive, EverythingElseInANameStays) {
    const auto sanitized = &PaneWithRows::_sanitizeForDiagnoseName;

    EXPECT_EQ(sanitized(""), "");
    EXPECT_EQ(sanitized("it's:_a\tpad\u00a0\n\\"), "it's:_a\tpad\u00a0\n\\");
    EXPECT_EQ(sanitized("‘Ünïcode“ 図"), "‘Ünïcode“_図");
    EXPECT_EQ(sanitized(".."), "..");
    EXPECT_EQ(sanitized(std::string(300, 'x')), std::string(300, 'x'));
}

TEST_F(DiagnosticArchive, ItsDirectoryIsClearedAndMadeAnew) {
    EXPECT_EQ(pane->_diagnosePathForMR(), archive);

    EXPECT_THAT(calls(), ElementsAre(remove, createParent, create));
    EXPECT_THAT(lines(), ElementsAre());
}

TEST_F(DiagnosticArchive, ItsNameHasTheDevicesNameAndTheTime) {
    platform.deviceInfo.name = Text("Lab’s Pad / 2");
    platform.clock.date = Date(std::chrono::seconds(1'709'647'629));

    EXPECT_EQ(pane->_diagnosePathForMR(),
              path("stratafile-Lab's_Pad_:_2-yy.MM.dd-HH.mm.ss@1709647629.tar.gz"));
}

TEST_F(DiagnosticArchive, ADeviceWithoutANameHasAnArchiveAllTheSame) {
    platform.deviceInfo.name = Text();

    EXPECT_EQ(pane->_diagnosePathForMR(), path("stratafile--yy.MM.dd-HH.mm.ss@5.tar.gz"));
}

TEST_F(DiagnosticArchive, NothingToClearIsNoError) {
    platform.fileManager.removeOutcomes = {kNothingThere};

    EXPECT_EQ(pane->_diagnosePathForMR(), archive);
    EXPECT_THAT(calls(), ElementsAre(remove, createParent, create));
    EXPECT_THAT(lines(), ElementsAre());
}

TEST_F(DiagnosticArchive, ADirectoryThatCannotBeClearedIsLogged) {
    platform.fileManager.removeOutcomes = {kFull};

    EXPECT_EQ(pane->_diagnosePathForMR(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove));
    EXPECT_EQ(lines(), full);
}

TEST_F(DiagnosticArchive, OnlyTheMissingFileOfThePlatformIsNoError) {
    for (const Error& other : {Error{PlatformErrorDomain, FileNoSuchFileError + 1, "other code"},
                               Error{"disk", FileNoSuchFileError, "other domain"}}) {
        platform.fileManager.removeOutcomes = {other};
        EXPECT_EQ(pane->_diagnosePathForMR(), std::nullopt) << other;
    }
    EXPECT_EQ(lines().size(), 2U);
}

TEST_F(DiagnosticArchive, AParentThatCannotBeMadeIsLogged) {
    platform.fileManager.createOutcomes = {kFull};

    EXPECT_EQ(pane->_diagnosePathForMR(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove, createParent));
    EXPECT_EQ(lines(), full);
}

TEST_F(DiagnosticArchive, ADirectoryThatCannotBeMadeIsLogged) {
    platform.fileManager.createOutcomes = {std::nullopt, kFull};

    EXPECT_EQ(pane->_diagnosePathForMR(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove, createParent, create));
    EXPECT_EQ(lines(), full);
}

TEST_F(DiagnosticArchive, TheMissingFileIsAnErrorWhereADirectoryIsToBeMade) {
    platform.fileManager.createOutcomes = {kNothingThere};

    EXPECT_EQ(pane->_diagnosePathForMR(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove, createParent));
}

TEST_F(DiagnosticArchive, ItsDirectoryIsClearedTwiceBeforeTheToolRuns) {
    EXPECT_EQ(pane->_collectMRLogs(), FileURL(archive));

    EXPECT_THAT(calls(), ElementsAre(remove, createParent, create, remove, createParent, create,
                                     "spawn /usr/bin/mrctl", "wait for 42"));
}

TEST_F(DiagnosticArchive, TheToolGetsThePathAsTheFileSystemHasIt) {
    ASSERT_TRUE(pane->_collectMRLogs());

    ASSERT_EQ(platform.processes.requests.size(), 1U);
    const SpawnRequest& request = platform.processes.requests.front();
    EXPECT_THAT(request.arguments,
                ElementsAre("/usr/bin/mrctl", "diagnose", "--no-logarchive", "/device" + archive));
    EXPECT_EQ(request.environment, std::nullopt);
}

TEST_F(DiagnosticArchive, WhatTheToolPrintsIsThrownAway) {
    ASSERT_TRUE(pane->_collectMRLogs());

    const auto& opens = platform.processes.requests.front().fileActions.opens();
    ASSERT_EQ(opens.size(), 2U);
    for (const int descriptor : {1, 2}) {
        const auto& open = opens.at(static_cast<std::size_t>(descriptor) - 1);
        EXPECT_EQ(open.descriptor, descriptor);
        EXPECT_EQ(open.path, "/dev/null");
        EXPECT_EQ(open.flags, O_RDWR);
        EXPECT_EQ(open.mode, 0666U);
    }
}

TEST_F(DiagnosticArchive, TheSecondPathCounts) {
    // The clock moves between the two calls, when the log line of neither is written.
    class MovingClock final : public Clock {
    public:
        [[nodiscard]] Date now() const override { return Date(std::chrono::seconds(++_seconds)); }

    private:
        mutable int _seconds = 0;
    } clock;
    PlatformServices services = platform.services();
    services.clock = clock;
    const auto other = std::make_shared<PaneWithRows>(services);

    EXPECT_EQ(other->_collectMRLogs(),
              FileURL(path("stratafile-Phone-yy.MM.dd-HH.mm.ss@2.tar.gz")));
}

TEST_F(DiagnosticArchive, NoToolRunsWithoutADirectory) {
    platform.fileManager.removeOutcomes = {kFull};

    EXPECT_EQ(pane->_collectMRLogs(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove));
}

TEST_F(DiagnosticArchive, NoToolRunsWhereTheSecondClearingFails) {
    platform.fileManager.removeOutcomes = {std::nullopt, kFull};

    EXPECT_EQ(pane->_collectMRLogs(), std::nullopt);
    EXPECT_THAT(calls(), ElementsAre(remove, createParent, create, remove));
    EXPECT_EQ(lines(), full);
}

TEST_F(DiagnosticArchive, NoToolRunsForAPathThatNoFileCanHave) {
    platform.fileManager.hasRepresentation = false;

    EXPECT_EQ(pane->_collectMRLogs(), std::nullopt);
    EXPECT_THAT(platform.processes.requests, ElementsAre());
}

TEST_F(DiagnosticArchive, AToolThatDoesNotStartLeavesNone) {
    platform.processes.spawned = std::unexpected(ENOENT);

    EXPECT_EQ(pane->_collectMRLogs(), std::nullopt);
    EXPECT_EQ(calls().back(), "spawn /usr/bin/mrctl");
    EXPECT_THAT(lines(), ElementsAre());
}

TEST_F(DiagnosticArchive, OnlyAToolThatExitsWithZeroHasMadeOne) {
    const auto makesOne = [this](std::expected<int, int> status) {
        platform.processes.status = status;
        return pane->_collectMRLogs().has_value();
    };
    constexpr int coreDumped = 0x80;
    constexpr int exitCodes = 256;
    constexpr int signals = 65;

    EXPECT_TRUE(makesOne(0));
    for (int code = 1; code < exitCodes; ++code) {
        EXPECT_FALSE(makesOne(code << 8)) << "exit " << code;
    }
    for (int signal = 1; signal < signals; ++signal) {
        EXPECT_FALSE(makesOne(signal)) << "signal " << signal;
        EXPECT_FALSE(makesOne(signal | coreDumped)) << "core of signal " << signal;
    }
    // The bit of the core dump says nothing by itself.
    EXPECT_TRUE(makesOne(coreDumped));
    EXPECT_FALSE(makesOne(std::unexpected(ECHILD)));
    EXPECT_THAT(lines(), ElementsAre());
}

/// Notes in the list of all calls when it is asked what.
class NotingDevice final : public DeviceInfo, public Clock {
public:
    explicit NotingDevice(Calls& calls) : _calls(calls) {}

    [[nodiscard]] Text copyAnswerForQuestion(const Text& question) const override {
        _calls.push_back("ask " + question.string());
        return Text("Phone");
    }
    [[nodiscard]] Date now() const override {
        _calls.emplace_back("now");
        return {};
    }
    [[nodiscard]] bool boolAnswerForQuestion(const Text& /*question*/) const override {
        return false;
    }
    [[nodiscard]] Text VariantStringKeyForKey(const Text& key) const override { return key; }
    [[nodiscard]] UserInterfaceIdiom userInterfaceIdiom() const override { return {}; }
    [[nodiscard]] std::optional<Screen> mainScreen() const override { return std::nullopt; }

private:
    Calls& _calls;
};

TEST_F(DiagnosticArchive, TheNameIsAskedBeforeTheDirectoryIsMadeAndTheTimeAfter) {
    NotingDevice device(platform.calls);
    PlatformServices services = platform.services();
    services.deviceInfo = device;
    services.clock = device;
    const auto other = std::make_shared<PaneWithRows>(services);

    ASSERT_TRUE(other->_collectMRLogs());

    const std::string ask = "ask UserAssignedDeviceName";
    EXPECT_THAT(calls(),
                ElementsAre(ask, remove, createParent, create, "now", ask, remove, createParent,
                            create, "now", "spawn /usr/bin/mrctl", "wait for 42"));
}

} // namespace
} // namespace nimbra::test
