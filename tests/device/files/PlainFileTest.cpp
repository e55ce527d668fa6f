#include "device/files/PlainFile.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

struct PlainFileTest : testing::Test {
    test::TemporaryDirectory directory;
    std::filesystem::path path = directory.path() / "file";

    [[nodiscard]] std::string errorOf(std::size_t mostBytes) const {
        const auto file = PlainFile::read(path, mostBytes, "/the/file");
        return file ? "no error" : file.error().description;
    }
};

TEST_F(PlainFileTest, AFileIsReadWithItsVersion) {
    const std::string content(100'000, 'x');
    test::writeTestFile(path, content);

    const auto file = PlainFile::read(path, content.size(), "/the/file");

    ASSERT_TRUE(file) << file.error();
    EXPECT_EQ(file->content, content);
    EXPECT_EQ(file->version.stamp(), stampOfPlainFile(path));
}

TEST_F(PlainFileTest, AFileThatIsTooLargeIsAnError) {
    test::writeTestFile(path, "12345");

    EXPECT_EQ(errorOf(4), "/the/file: is larger than 4 bytes");
    EXPECT_EQ(errorOf(5), "no error");
}

TEST_F(PlainFileTest, AMissingFileIsAnError) {
    EXPECT_EQ(errorOf(5), "/the/file: cannot be read: No such file or directory");
}

TEST_F(PlainFileTest, WhatIsNoPlainFileIsAnErrorAndNothingWaitsForIt) {
    std::filesystem::create_directory(path);
    EXPECT_EQ(errorOf(5), "/the/file: is a directory");

    std::filesystem::remove(path);
    ASSERT_EQ(::mkfifo(path.c_str(), 0644), 0);
    EXPECT_EQ(errorOf(5), "/the/file: is not a plain file");

    std::filesystem::remove(path);
    test::writeTestFile(directory.path() / "target", "1");
    std::filesystem::create_symlink("target", path);
    EXPECT_EQ(errorOf(5), "/the/file: is not a plain file");
}

TEST_F(PlainFileTest, WithoutAVersionLinksAreFollowed) {
    test::writeTestFile(directory.path() / "target", "text");
    std::filesystem::create_symlink("target", path);

    EXPECT_EQ(readPlainFile(path), "text");
    EXPECT_EQ(readPlainFile(directory.path() / "target"), "text");
}

TEST_F(PlainFileTest, WithoutAVersionNothingElseIsReadOrWaitedFor) {
    const auto expectError = [this](const std::string& message) {
        const auto text = readPlainFile(path);
        ASSERT_FALSE(text);
        EXPECT_EQ(text.error().description, path.string() + ": " + message);
    };
    expectError("cannot be read: No such file or directory");

    const auto pipe = directory.path() / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0644), 0);
    for (const std::filesystem::path& target : {pipe, std::filesystem::path("/dev/zero")}) {
        std::filesystem::create_symlink(target, path);
        expectError("is not a plain file");
        std::filesystem::remove(path);
    }

    std::filesystem::create_directory(path);
    expectError("is a directory");
}

TEST_F(PlainFileTest, WithoutAVersionAFileThatIsTooLargeIsAnErrorToo) {
    test::writeTestFile(path, "");
    std::filesystem::resize_file(path, kMostBytesOfFile);
    EXPECT_TRUE(readPlainFile(path));

    std::filesystem::resize_file(path, kMostBytesOfFile + 1);
    const auto text = readPlainFile(path);
    ASSERT_FALSE(text);
    EXPECT_EQ(text.error().description, path.string() + ": is larger than 16000000 bytes");
}

} // namespace
} // namespace nimbra::device
