#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/apps/RecordedProcesses.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/apps/ChildProcess.h"
#include "tests/support/TemporaryDirectory.h"

#include <cstdint>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {
namespace {

/// The record of `child`, with a start time that is off by `difference`.
std::string recordOf(const test::ChildProcess& child, std::uint64_t difference = 0) {
    const auto startTime = Process::withNumber(child.number()).value().startTime().value();
    return ProcessRecord{.process = child.number(), .startTime = startTime + difference}.text();
}

class RunningRecordsTest : public testing::Test {
protected:
    void write(const std::string& application, const std::string& content) const {
        test::writeTestFile(root() / "run/nimbra" / (application + ".pid"), content);
    }
    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }
    [[nodiscard]] std::expected<bool, Error> isRunning(const std::string& application) {
        return RecordedProcesses(DevicePaths(root()), _log)
            .isRunning(BundleIdentifier(application));
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
};

TEST_F(RunningRecordsTest, AnApplicationRunsAsLongAsItsProcess) {
    test::ChildProcess child;
    write("notes", recordOf(child));
    EXPECT_EQ(isRunning("notes"), true);

    child.kill();
    child.awaitUnreaped();

    EXPECT_EQ(isRunning("notes"), false);
}

TEST_F(RunningRecordsTest, ARecordOfAnotherProcessIsNone) {
    const test::ChildProcess child;
    write("notes", recordOf(child, 1));

    EXPECT_EQ(isRunning("notes"), false);
    EXPECT_EQ(isRunning("missing"), false);
}

TEST_F(RunningRecordsTest, WhatIsNoRecordIsAnError) {
    write("notes", "no record");

    EXPECT_FALSE(isRunning("notes").has_value());
}

TEST_F(RunningRecordsTest, WhoAsksEndsNothingAndRemovesNothing) {
    test::ChildProcess child;
    write("notes", recordOf(child));
    write("another", recordOf(child, 1));
    const auto before = test::treeOf(root());

    EXPECT_EQ(isRunning("notes"), true);
    EXPECT_EQ(isRunning("another"), false);

    EXPECT_TRUE(child.isRunning());
    EXPECT_EQ(test::treeOf(root()), before);
}

} // namespace
} // namespace nimbra::device
