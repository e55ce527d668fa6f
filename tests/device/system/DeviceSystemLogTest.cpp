#include "device/system/DeviceSystemLog.h"

#include "tests/device/FullDisk.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/device/Threads.h"
#include "tests/support/TemporaryDirectory.h"

#include <cstdlib>
#include <gtest/gtest.h>
#include <iostream>
#include <regex>
#include <sstream>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace nimbra::device {
namespace {

class DeviceSystemLogTest : public testing::Test {
protected:
    void SetUp() override { ::unsetenv("NIMBRA_LOG"); }
    void TearDown() override { ::unsetenv("NIMBRA_LOG"); }

    [[nodiscard]] const std::filesystem::path& root() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path file() const {
        return root() / "var/log/nimbra/settings.log";
    }
    [[nodiscard]] DeviceSystemLog log() const {
        return {DevicePaths(root()), DeviceSystemLog::Destination::file};
    }

    /// The lines of the file without their times, which are checked.
    [[nodiscard]] std::string linesOfFile() const {
        static const std::regex time(
            R"((^|\n)\d{4}-\d\d-\d\dT\d\d:\d\d:\d\d\.\d{3}[+-]\d\d:\d\d )");
        return std::regex_replace(test::contentOf(file()), time, "$1");
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceSystemLogTest, EachLineOfTheFileNamesItsLevel) {
    ::setenv("NIMBRA_LOG", "debug", 1);
    DeviceSystemLog systemLog = log();
    testing::internal::CaptureStderr();

    systemLog.write(LogLevel::debug, "looked");
    systemLog.write(LogLevel::standard, "did {} and %s");
    systemLog.write(LogLevel::error, "failed\nbadly");

    EXPECT_EQ(linesOfFile(), "debug: looked\ndefault: did {} and %s\nerror: failed badly\n");
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "nimbra-settings: error: failed badly\n");
}

TEST_F(DeviceSystemLogTest, DebugIsDroppedUnlessItIsAskedFor) {
    DeviceSystemLog quiet = log();
    quiet.write(LogLevel::debug, "looked");

    EXPECT_FALSE(quiet.isEnabled(LogLevel::debug));
    EXPECT_TRUE(quiet.isEnabled(LogLevel::standard));
    EXPECT_TRUE(quiet.isEnabled(LogLevel::error));
    EXPECT_FALSE(std::filesystem::exists(file()));

    ::setenv("NIMBRA_LOG", "info", 1);
    EXPECT_FALSE(log().isEnabled(LogLevel::debug));
    ::setenv("NIMBRA_LOG", "debug", 1);
    EXPECT_TRUE(log().isEnabled(LogLevel::debug));
}

TEST_F(DeviceSystemLogTest, TheJournalGetsEachLevelByItsPriorityAndItsName) {
    const DeviceSystemLog systemLog(DevicePaths(root()), DeviceSystemLog::Destination::journal);
    const auto fields = [&](const std::string& priority, const std::string& level) {
        return std::vector<std::string>{
            "MESSAGE=two lines", "PRIORITY=" + priority, "SYSLOG_IDENTIFIER=nimbra-settings",
            "NIMBRA_LEVEL=" + level, "NIMBRA_DEVICE=" + root().string()};
    };

    EXPECT_EQ(systemLog.journalFields(LogLevel::debug, "two\nlines"), fields("7", "debug"));
    EXPECT_EQ(systemLog.journalFields(LogLevel::standard, "two\nlines"), fields("5", "default"));
    EXPECT_EQ(systemLog.journalFields(LogLevel::error, "two\nlines"), fields("3", "error"));
}

TEST_F(DeviceSystemLogTest, NothingIsMadeBeforeTheFirstLine) {
    {
        const DeviceSystemLog systemLog = log();
    }

    EXPECT_TRUE(test::treeOf(root()).empty());
}

TEST_F(DeviceSystemLogTest, AFileThatCannotBeOpenedIsToldOnceAndErrorsStillShow) {
    test::writeTestFile(root() / "var/log", "in the way");
    DeviceSystemLog systemLog = log();
    testing::internal::CaptureStderr();

    systemLog.write(LogLevel::standard, "did");
    systemLog.write(LogLevel::error, "failed");

    const std::string shown = testing::internal::GetCapturedStderr();
    EXPECT_EQ(shown, "nimbra-settings: " + file().string() +
                         ": cannot be made: Not a directory\nnimbra-settings: error: failed\n");
    EXPECT_EQ(test::contentOf(root() / "var/log"), "in the way");
}

TEST_F(DeviceSystemLogTest, ADeviceThatIsRemovedDoesNotComeBackWithItsLog) {
    const auto device = root() / "device";
    std::filesystem::create_directory(device);
    DeviceSystemLog systemLog(DevicePaths(device), DeviceSystemLog::Destination::file);
    std::filesystem::remove(device);
    testing::internal::CaptureStderr();

    systemLog.write(LogLevel::standard, "did");

    EXPECT_FALSE(std::filesystem::exists(device));
    const std::string shown = testing::internal::GetCapturedStderr();
    const std::string place = (device / "var/log/nimbra/settings.log").string();
    EXPECT_EQ(shown, "nimbra-settings: " + place + ": cannot be made: No such file or directory\n");
}

TEST_F(DeviceSystemLogTest, OnADeviceThatCanOnlyBeReadTheLineNamesItsFileAndTheReason) {
    DeviceSystemLog systemLog = log();
    testing::internal::CaptureStderr();

    {
        const test::ReadOnly readOnly(root());
        systemLog.write(LogLevel::standard, "did");
    }

    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "nimbra-settings: " + file().string() + ": cannot be made: Permission denied\n");
    EXPECT_TRUE(test::treeOf(root()).empty());
}

TEST_F(DeviceSystemLogTest, APipeInThePlaceOfTheFileIsNotWaitedFor) {
    std::filesystem::create_directories(file().parent_path());
    ASSERT_EQ(::mkfifo(file().c_str(), 0600), 0);
    DeviceSystemLog systemLog = log();
    testing::internal::CaptureStderr();

    systemLog.write(LogLevel::standard, "did");

    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "nimbra-settings: " + file().string() +
                  ": cannot be made: No such device or address\n");
}

TEST_F(DeviceSystemLogTest, ALineThatFindsNoRoomIsToldWithTheReason) {
    DeviceSystemLog systemLog = log();
    systemLog.write(LogLevel::standard, "did");
    // On no disk, which is full for every file.
    std::ostringstream shown;
    std::streambuf* const usual = std::cerr.rdbuf(shown.rdbuf());

    {
        const test::FullDisk full;
        systemLog.write(LogLevel::standard, "did more");
    }

    std::cerr.rdbuf(usual);
    EXPECT_EQ(linesOfFile(), "default: did\n");
    EXPECT_EQ(shown.str(),
              "nimbra-settings: " + file().string() + ": cannot be written: File too large\n");
}

TEST_F(DeviceSystemLogTest, ManyThreadsMayWriteWholeLines) {
    DeviceSystemLog systemLog = log();
    const auto write = [&systemLog] {
        for (int round = 0; round < 50; ++round) {
            systemLog.write(LogLevel::standard, "line");
        }
    };

    test::runAtOnce({write, write, write, write});

    std::string expected;
    for (int index = 0; index < 200; ++index) {
        expected += "default: line\n";
    }
    EXPECT_EQ(linesOfFile(), expected);
}

} // namespace
} // namespace nimbra::device
