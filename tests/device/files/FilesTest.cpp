#include "device/files/Files.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

TEST(FilesTest, AWrittenFileIsReadBackByteByByte) {
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "file";
    std::string content(200000, 'x');
    content += '\0';
    content += "\n\xff";

    ASSERT_TRUE(writeFileAtomically(path, content));

    EXPECT_EQ(readFile(path), content);
    EXPECT_EQ(test::treeOf(directory.path()).size(), 1U);
}

TEST(FilesTest, WhatHasNoEndIsNotReadForEver) {
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "file";
    test::writeTestFile(path, "");
    std::filesystem::resize_file(path, kMostBytesOfInput);
    const auto greatest = readFile(path);
    std::filesystem::resize_file(path, kMostBytesOfInput + 1);

    const auto larger = readFile(path);
    const auto endless = readFile("/dev/zero");

    ASSERT_TRUE(greatest) << greatest.error();
    EXPECT_EQ(greatest->size(), kMostBytesOfInput);
    ASSERT_FALSE(larger);
    EXPECT_EQ(larger.error().description, path.string() + ": is larger than 64000000 bytes");
    ASSERT_FALSE(endless);
    EXPECT_EQ(endless.error().description, "/dev/zero: is larger than 64000000 bytes");
}

TEST(FilesTest, WritingReplacesTheContentAndKeepsThePermissions) {
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "file";
    test::writeTestFile(path, "old and longer");
    ASSERT_EQ(::chmod(path.c_str(), 0640), 0);

    ASSERT_TRUE(writeFileAtomically(path, "new"));

    EXPECT_EQ(test::contentOf(path), "new");
    using std::filesystem::perms;
    EXPECT_EQ(std::filesystem::status(path).permissions(),
              perms::owner_read | perms::owner_write | perms::group_read);
}

TEST(FilesTest, AWriteThatCannotStartNamesTheFile) {
    const test::TemporaryDirectory directory;
    test::writeTestFile(directory.path() / "file", "in the way");

    const auto written = writeFileAtomically(directory.path() / "file/below", "text");

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description,
              (directory.path() / "file/below").string() + ": cannot be written: Not a directory");
    EXPECT_EQ(test::treeOf(directory.path()),
              (std::map<std::string, std::string>{{"file", "in the way"}}));
}

TEST(FilesTest, AWriteThatCannotEndLeavesNothingBeside) {
    const test::TemporaryDirectory directory;
    std::filesystem::create_directories(directory.path() / "place/taken");

    const auto written = writeFileAtomically(directory.path() / "place", "text");

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description,
              (directory.path() / "place").string() + ": cannot be written: Is a directory");
    EXPECT_EQ(
        test::treeOf(directory.path()),
        (std::map<std::string, std::string>{{"place", "directory"}, {"place/taken", "directory"}}));
}

TEST(FilesTest, AFileHasThePermissionsThatAreAskedForWhateverItHadBefore) {
    using std::filesystem::perms;
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "file";
    const mode_t earlier = ::umask(077);

    ASSERT_TRUE(writeFileAtomically(path, "text", 0755));
    EXPECT_EQ(std::filesystem::status(path).permissions(), perms(0755));
    ASSERT_TRUE(writeFileAtomically(path, "other", 0600));
    EXPECT_EQ(std::filesystem::status(path).permissions(), perms(0600));
    ASSERT_TRUE(writeFileAtomically(path, "third"));
    EXPECT_EQ(std::filesystem::status(path).permissions(), perms(0600));

    ::umask(earlier);
}

TEST(FilesTest, NewFilesAreReadableByEverybody) {
    const test::TemporaryDirectory directory;
    const std::map<std::string, std::string> files{{"a", "text"}, {"b", ""}};

    ASSERT_TRUE(writeNewFiles(directory.path(), files));

    EXPECT_EQ(test::treeOf(directory.path()), files);
    using std::filesystem::perms;
    EXPECT_EQ(std::filesystem::status(directory.path() / "a").permissions(),
              perms::owner_read | perms::owner_write | perms::group_read | perms::others_read);
}

TEST(FilesTest, ManyNewFilesAreWrittenLikeFew) {
    const test::TemporaryDirectory directory;
    std::map<std::string, std::string> files;
    for (int index = 0; index < 100; ++index) {
        files.emplace(std::to_string(index), "content " + std::to_string(index));
    }

    ASSERT_TRUE(writeNewFiles(directory.path(), files));

    EXPECT_EQ(test::treeOf(directory.path()), files);
}

TEST(FilesTest, ANewFileNeverTakesTheFileThatStandsThere) {
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "file";
    test::writeTestFile(path, "mine");

    const auto written = writeNewFiles(directory.path(), {{"file", "text"}});

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description, path.string() + ": cannot be written: File exists");
    EXPECT_EQ(test::contentOf(path), "mine");
}

TEST(FilesTest, NewFilesNeedTheirDirectory) {
    const test::TemporaryDirectory directory;
    const auto missing = directory.path() / "missing";

    const auto written = writeNewFiles(missing, {});

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description,
              missing.string() + ": cannot be written: No such file or directory");
}

TEST(FilesTest, ADirectoryThatIsMissingCannotBeFlushed) {
    const test::TemporaryDirectory directory;

    const auto synchronized = synchronizeDirectory(directory.path() / "missing");

    ASSERT_FALSE(synchronized);
    EXPECT_EQ(synchronized.error().description, (directory.path() / "missing").string() +
                                                    ": cannot be flushed: No such file or "
                                                    "directory");
}

} // namespace
} // namespace nimbra::device
