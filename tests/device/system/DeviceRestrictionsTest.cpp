#include "device/system/DeviceRestrictions.h"

#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

struct DeviceRestrictionsTest : testing::Test {
    test::TemporaryDirectory directory;
    test::RecordingLog log;
    std::filesystem::path file = directory.path() / "var/lib/nimbra/restrictions.json";
    DeviceRestrictions restrictions{DevicePaths(directory.path()), log};

    [[nodiscard]] bool isAllowed(const std::string& bundle) const {
        return restrictions.isCloudSyncAllowed(BundleIdentifier(bundle));
    }
    /// The lines of the log, without what they have in common.
    [[nodiscard]] std::vector<std::string> problems() const {
        std::vector<std::string> problems;
        const std::string start =
            "Can't read the restrictions: /var/lib/nimbra/restrictions.json: ";
        for (const std::string& line : log.lines()) {
            EXPECT_TRUE(line.starts_with(start)) << line;
            problems.push_back(line.substr(std::min(line.size(), start.size())));
        }
        return problems;
    }
};

TEST_F(DeviceRestrictionsTest, OnlyTheApplicationsThatAreNamedAreDenied) {
    test::writeTestFile(file, R"({"cloudSyncDenied": ["com.a", "com.b"]})");

    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_FALSE(isAllowed("com.b"));
    EXPECT_TRUE(isAllowed("com.c"));
    EXPECT_TRUE(isAllowed("com"));
    EXPECT_TRUE(restrictions.isAppCellularDataModificationAllowed());
    EXPECT_EQ(problems(), std::vector<std::string>{});
}

TEST_F(DeviceRestrictionsTest, AChangeOfTheSameLengthIsNoticedAtOnce) {
    for (int time = 0; time < 300; ++time) {
        const bool isA = time % 2 == 0;
        test::writeTestFile(file, isA ? R"({"cloudSyncDenied": ["com.a"]})"
                                      : R"({"cloudSyncDenied": ["com.b"]})");
        ASSERT_EQ(isAllowed("com.a"), !isA);
        ASSERT_EQ(isAllowed("com.b"), isA);
    }
}

TEST_F(DeviceRestrictionsTest, AFileThatCannotBeReadAllowsNothingAndIsLoggedOnce) {
    for (int time = 0; time < 100; ++time) {
        EXPECT_FALSE(isAllowed("com.a"));
        EXPECT_FALSE(restrictions.isAppCellularDataModificationAllowed());
    }
    EXPECT_EQ(problems(), std::vector<std::string>{"cannot be read: No such file or directory"});

    test::writeTestFile(file, R"({"cloudSyncDenied": 1})");
    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_EQ(problems().size(), 2U);
    EXPECT_EQ(problems().back(), "/cloudSyncDenied: expected an array, found 1");

    test::writeTestFile(file, "{}");
    EXPECT_TRUE(isAllowed("com.a"));
    std::filesystem::remove(file);
    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_EQ(problems().size(), 3U);
}

TEST_F(DeviceRestrictionsTest, APipeIsNotWaitedFor) {
    std::filesystem::create_directories(file.parent_path());
    ASSERT_EQ(::mkfifo(file.c_str(), 0644), 0);

    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_EQ(problems(), std::vector<std::string>{"is not a plain file"});
}

TEST_F(DeviceRestrictionsTest, ALinkIsFollowedAsTheDeviceWould) {
    test::writeTestFile(directory.path() / "etc/a.json", R"({"cloudSyncDenied": ["com.a"]})");
    test::writeTestFile(directory.path() / "etc/b.json", R"({"cloudSyncDenied": ["com.b"]})");
    std::filesystem::create_directories(file.parent_path());
    std::filesystem::create_symlink("/etc/a.json", file);
    EXPECT_FALSE(isAllowed("com.a"));

    std::filesystem::remove(file);
    std::filesystem::create_symlink("../../../etc/b.json", file);
    EXPECT_TRUE(isAllowed("com.a"));
    EXPECT_FALSE(isAllowed("com.b"));
    EXPECT_EQ(problems(), std::vector<std::string>{});
}

TEST_F(DeviceRestrictionsTest, ACircleOfLinksAllowsNothingAndIsLoggedOnce) {
    std::filesystem::create_directories(file.parent_path());
    std::filesystem::create_symlink("restrictions.json", file);

    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_FALSE(isAllowed("com.a"));
    EXPECT_EQ(problems(),
              std::vector<std::string>{"cannot be followed: Too many levels of symbolic links"});
}

} // namespace
} // namespace nimbra::device
