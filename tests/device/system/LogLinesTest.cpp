#include "device/system/LogLines.h"

#include "device/system/DeviceSystemLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using Lines = std::vector<std::string>;

class LogLinesTest : public testing::Test {
protected:
    void write(const std::string& name, const std::string& content) const {
        test::writeTestFile(_directory.path() / "var/log/nimbra" / name, content);
    }
    [[nodiscard]] DevicePaths paths() const { return DevicePaths(_directory.path()); }
    [[nodiscard]] Lines newest(std::size_t most) const {
        const auto lines = newestLogLines(paths(), most);
        EXPECT_TRUE(lines) << lines.error();
        return lines.value_or(Lines());
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(LogLinesTest, WhatTheLogHasWrittenIsRead) {
    DeviceSystemLog(paths(), DeviceSystemLog::Destination::file).write(LogLevel::standard, "hello");

    const Lines lines = newest(10);

    ASSERT_EQ(lines.size(), 1U);
    EXPECT_TRUE(lines.front().ends_with(": hello")) << lines.front();
}

TEST_F(LogLinesTest, TheNewestLinesOfAllFilesAreGivenInTheirOrder) {
    write("settings.2.log", "1\n2\n");
    write("settings.1.log", "3\n4\n");
    write("settings.log", "5\n6");

    EXPECT_EQ(newest(100), (Lines{"1", "2", "3", "4", "5", "6"}));
    EXPECT_EQ(newest(3), (Lines{"4", "5", "6"}));
    EXPECT_EQ(newest(2), (Lines{"5", "6"}));
    EXPECT_EQ(newest(0), Lines());
}

TEST_F(LogLinesTest, OfALargeFileWholeLinesAreRead) {
    std::string content;
    while (content.size() < 9'000'000) {
        content += std::to_string(content.size()) + std::string(90, 'x') + '\n';
    }
    write("settings.log", content);

    const Lines lines = newest(1'000'000);

    std::string end;
    for (const std::string& line : lines) {
        end += line + '\n';
    }
    EXPECT_GT(end.size(), 8'000'000U);
    EXPECT_TRUE(content.ends_with('\n' + end));
}

TEST_F(LogLinesTest, BytesThatAreNoTextStayInTheirLine) {
    write("settings.log", "a\xff\tb\n");

    EXPECT_EQ(newest(1), Lines{"a\ufffd b"});
}

TEST_F(LogLinesTest, NoLogFileIsAnError) {
    EXPECT_EQ(newestLogLines(paths(), 1).error().code, ENOENT);

    std::filesystem::create_directories(paths().root() / "var/log/nimbra/settings.log");
    EXPECT_EQ(newestLogLines(paths(), 1).error().code, EISDIR);
}

} // namespace
} // namespace nimbra::device
