#include "device/files/DevicePaths.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

class DevicePathsTest : public testing::Test {
protected:
    [[nodiscard]] std::string resolved(const std::string& devicePath) const {
        const auto path = _paths.resolve(devicePath);
        return path ? path->lexically_relative(_directory.path()).string()
                    : path.error().description;
    }

    [[nodiscard]] const std::filesystem::path& root() const { return _directory.path(); }

private:
    test::TemporaryDirectory _directory;
    DevicePaths _paths{_directory.path()};
};

TEST_F(DevicePathsTest, PathsStandBelowTheRoot) {
    EXPECT_EQ(resolved("/var/lib/nimbra"), "var/lib/nimbra");
    EXPECT_EQ(resolved("var/lib"), "var/lib");
    EXPECT_EQ(resolved("//var/./lib//x"), "var/lib/x");
}

TEST_F(DevicePathsTest, DotDotStopsAtTheRoot) {
    EXPECT_EQ(resolved("/../../etc/passwd"), "etc/passwd");
    EXPECT_EQ(resolved("/var/../../../x"), "x");
}

TEST_F(DevicePathsTest, LinksAreFollowedInsideTheRoot) {
    std::filesystem::create_directories(root() / "var");
    std::filesystem::create_symlink("/etc", root() / "var/absolute");
    std::filesystem::create_symlink("../../../etc", root() / "var/relative");
    std::filesystem::create_symlink("absolute/deeper", root() / "var/twice");

    EXPECT_EQ(resolved("/var/absolute/passwd"), "etc/passwd");
    EXPECT_EQ(resolved("/var/relative/passwd"), "etc/passwd");
    EXPECT_EQ(resolved("/var/twice/x"), "etc/deeper/x");
}

TEST_F(DevicePathsTest, LinksThatLeadRoundInACircleAreAnError) {
    std::filesystem::create_symlink("b", root() / "a");
    std::filesystem::create_symlink("a", root() / "b");

    const std::string failure = resolved("/a/x");

    EXPECT_TRUE(failure.ends_with(": cannot be followed: Too many levels of symbolic links"))
        << failure;
}

TEST_F(DevicePathsTest, AnErrorAboutAPlaceBelowTheRootCallsItAsTheDeviceDoes) {
    const auto said = [](const std::filesystem::path& root, const std::string& description) {
        const Error error{.domain = "d", .code = 3, .description = description};
        const Error named = DevicePaths(root).asTheDeviceSaysIt(error);
        EXPECT_EQ(named.domain, "d");
        EXPECT_EQ(named.code, 3);
        return named.description;
    };

    EXPECT_EQ(said("/a/b", "/a/b/var/x: is bad"), "/var/x: is bad");
    EXPECT_EQ(said("/a/b/", "/a/b/var/x: is bad"), "/var/x: is bad");
    EXPECT_EQ(said("b", "b/var/x: is bad"), "/var/x: is bad");
    EXPECT_EQ(said("b\n", "b /var/x: is bad"), "/var/x: is bad");
    // What begins otherwise, or only with the same letters, is something else.
    EXPECT_EQ(said("/a/b", "/a/bc/x: is bad"), "/a/bc/x: is bad");
    EXPECT_EQ(said("/a/b", "/x: not /a/b/x"), "/x: not /a/b/x");
    EXPECT_EQ(said("/a/b", "/a/b: is bad"), "/a/b: is bad");
    EXPECT_EQ(said("/", "/var/x: is bad"), "/var/x: is bad");
}

} // namespace
} // namespace nimbra::device
