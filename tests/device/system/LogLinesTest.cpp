#include "device/system/LogLines.h"

#include "device/system/DeviceSystemLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <gtest/gtest.h>
#include <sys/stat.h>

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
    for (const std::string& line : Lines(lines.begin() + 1, lines.end())) {
        end += line + '\n';
    }
    EXPECT_GT(end.size(), 8'000'000U);
    EXPECT_TRUE(content.ends_with('\n' + end));
    EXPECT_EQ(lines.front(),
              "(left out here: " + std::to_string(content.size() - end.size()) + " bytes)");
}

TEST_F(LogLinesTest, AHoleBetweenTwoFilesIsTold) {
    write("settings.1.log", "earlier\n");
    write("settings.log", std::string(9'000'000, 'x') + "\nlast\n");

    EXPECT_EQ(newest(100), (Lines{"earlier", "(left out here: 9000001 bytes)", "last"}));
    EXPECT_EQ(newest(1), Lines{"last"});
}

TEST_F(LogLinesTest, ALineThatIsTooLongIsLeftOutAndTold) {
    for (const std::string end : {"", "\n"}) {
        write("settings.log", std::string(9'000'000, 'x') + end);

        EXPECT_EQ(newest(100),
                  Lines{"(left out here: " + std::to_string(9'000'000 + end.size()) + " bytes)"});
    }
}

TEST_F(LogLinesTest, NoFileIsALinkOutOfTheDevice) {
    const test::TemporaryDirectory outside;
    test::writeTestFile(outside.path() / "secret", "secret\n");
    const auto secret = outside.path() / "secret";
    for (const auto& target :
         {secret, secret.lexically_relative(paths().root() / "var/log/nimbra")}) {
        for (const std::string name : {"settings.1.log", "settings.2.log"}) {
            write("settings.1.log", "earlier\n");
            write("settings.log", "last\n");
            const auto link = paths().root() / "var/log/nimbra" / name;
            std::filesystem::remove(link);
            std::filesystem::create_symlink(target, link);

            EXPECT_EQ(newest(100),
                      name == "settings.1.log" ? Lines{"last"} : (Lines{"earlier", "last"}));
            std::filesystem::remove(link);
        }
    }
}

TEST_F(LogLinesTest, ALinkIsFollowedAsTheDeviceWould) {
    test::writeTestFile(paths().root() / "var/old/1", "earlier\n");
    write("settings.log", "last\n");
    std::filesystem::create_symlink("/var/old/1", paths().root() / "var/log/nimbra/settings.1.log");

    EXPECT_EQ(newest(100), (Lines{"earlier", "last"}));
}

TEST_F(LogLinesTest, APipeIsNotWaitedFor) {
    for (const std::string name : {"settings.log", "settings.1.log"}) {
        write("settings.log", "last\n");
        const auto pipe = paths().root() / "var/log/nimbra" / name;
        std::filesystem::remove(pipe);
        ASSERT_EQ(::mkfifo(pipe.c_str(), 0644), 0);

        EXPECT_EQ(newestLogLines(paths(), 100).error().description,
                  pipe.string() + ": is not a plain file");
        std::filesystem::remove(pipe);
    }
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
