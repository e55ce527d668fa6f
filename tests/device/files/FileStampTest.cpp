#include "device/files/FileStamp.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using std::chrono::nanoseconds;
using std::chrono::seconds;

FileStamp changedAt(nanoseconds time) {
    return {.device = 1, .inode = 2, .size = 3, .modified = seconds(5), .changed = time};
}

struct FileStampTest : testing::Test {
    test::TemporaryDirectory directory;
    std::filesystem::path file = directory.path() / "file";
};

TEST_F(FileStampTest, ThePlainFileAtAPathHasAStamp) {
    test::writeTestFile(file, "abc");

    const auto stamp = stampOfPlainFile(file);

    ASSERT_TRUE(stamp);
    EXPECT_EQ(stamp->size, 3);
    EXPECT_EQ(stamp, stampOfPlainFile(file));
}

TEST_F(FileStampTest, WhatIsNoPlainFileHasNone) {
    test::writeTestFile(directory.path() / "target", "abc");
    std::filesystem::create_symlink("target", file);

    EXPECT_EQ(stampOfPlainFile(file), std::nullopt);
    EXPECT_EQ(stampOfPlainFile(directory.path()), std::nullopt);
    EXPECT_EQ(stampOfPlainFile(directory.path() / "missing"), std::nullopt);
}

TEST_F(FileStampTest, AnotherFileInItsPlaceHasAnotherStamp) {
    test::writeTestFile(file, "abc");
    test::writeTestFile(directory.path() / "other", "def");
    const auto modified = std::filesystem::last_write_time(file);
    const auto before = stampOfPlainFile(file);

    std::filesystem::rename(directory.path() / "other", file);
    std::filesystem::last_write_time(file, modified);

    EXPECT_NE(stampOfPlainFile(file), before);
}

TEST_F(FileStampTest, TheFilesClockIsNotAheadOfTheFiles) {
    const auto before = fileClockNow();
    test::writeTestFile(file, "abc");

    EXPECT_GE(stampOfPlainFile(file)->changed, before);
}

TEST(FileVersionTest, AVersionHoldsForItsStampOnly) {
    const FileVersion version(changedAt(nanoseconds(7)), seconds(9));

    EXPECT_TRUE(version.stillHolds(changedAt(nanoseconds(7))));
    EXPECT_FALSE(version.stillHolds(changedAt(nanoseconds(8))));
    FileStamp longer = changedAt(nanoseconds(7));
    ++longer.size;
    EXPECT_FALSE(version.stillHolds(longer));
}

TEST(FileVersionTest, WhatWasReadInTheTickOfTheChangeDoesNotHold) {
    const nanoseconds tick(1'000'000'004);

    EXPECT_TRUE(FileVersion(changedAt(tick - nanoseconds(1)), tick)
                    .stillHolds(changedAt(tick - nanoseconds(1))));
    EXPECT_FALSE(FileVersion(changedAt(tick), tick).stillHolds(changedAt(tick)));
    EXPECT_FALSE(FileVersion(changedAt(tick + nanoseconds(1)), tick)
                     .stillHolds(changedAt(tick + nanoseconds(1))));
}

TEST(FileVersionTest, WhereFilesAreMarkedInWholeSecondsItTakesThemToSettle) {
    const FileStamp stamp = changedAt(seconds(10));

    EXPECT_FALSE(FileVersion(stamp, seconds(11)).stillHolds(stamp));
    EXPECT_FALSE(FileVersion(stamp, seconds(12)).stillHolds(stamp));
    EXPECT_TRUE(FileVersion(stamp, seconds(12) + nanoseconds(1)).stillHolds(stamp));
}

TEST(FileVersionTest, WhatWasNotReadOrIsForgottenDoesNotHold) {
    const FileStamp stamp = changedAt(nanoseconds(7));
    FileVersion version(stamp, seconds(9));
    version.forget();

    EXPECT_FALSE(version.stillHolds(stamp));
    EXPECT_EQ(version.stamp(), stamp);
    EXPECT_FALSE(FileVersion::unread(stamp).stillHolds(stamp));
    EXPECT_EQ(FileVersion::unread(stamp).stamp(), stamp);
    EXPECT_FALSE(FileVersion().stillHolds(FileStamp()));
    EXPECT_EQ(FileVersion().stamp(), std::nullopt);
}

} // namespace
} // namespace nimbra::device
