#include "device/files/Folders.h"

#include "tests/device/ReadOnly.h"
#include "tests/support/TemporaryDirectory.h"

#include <expected>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

constexpr mode_t kForItsOwner = 0700;

class FoldersTest : public testing::Test {
protected:
    FoldersTest() { std::filesystem::create_directory(root()); }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] auto make(std::string_view place) const {
        return makeFolder(DevicePaths(root()), place, kForItsOwner);
    }
    [[nodiscard]] static std::filesystem::perms modeOf(const std::filesystem::path& path) {
        return std::filesystem::status(path).permissions();
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(FoldersTest, ADeviceIsKnownByTheFolderOfItsState) {
    const auto expectNone = [this] {
        const auto checked = checkStateFolder(DevicePaths(root()));
        ASSERT_FALSE(checked);
        EXPECT_EQ(checked.error().description,
                  root().string() + ": not a device directory: it has no folder var/lib/nimbra");
    };
    expectNone();
    std::filesystem::create_directories(root() / "var/lib");
    std::ofstream(root() / "var/lib/nimbra") << "in the way";
    expectNone();

    std::filesystem::remove(root() / "var/lib/nimbra");
    std::filesystem::create_directory(root() / "var/lib/nimbra");

    EXPECT_TRUE(checkStateFolder(DevicePaths(root())));
}

TEST_F(FoldersTest, AStateThatCannotBeSeenIsNotTakenForNone) {
    using std::filesystem::perms;
    std::filesystem::create_directories(root() / "var/lib/nimbra");
    const auto other = root() / "other";
    std::filesystem::create_directory(other);
    std::filesystem::permissions(root().parent_path(), perms(0755));
    std::filesystem::permissions(root() / "var", perms::none);

    const auto checked = [&] {
        // Root sees everything, so the test is somebody else for a while.
        const test::ReadOnly readOnly(other);
        return checkStateFolder(DevicePaths(root()));
    }();
    std::filesystem::permissions(root() / "var", perms::owner_all);

    ASSERT_FALSE(checked);
    EXPECT_EQ(checked.error().description,
              (root() / "var/lib/nimbra").string() + ": cannot be read: Permission denied");
}

TEST_F(FoldersTest, AFolderIsMadeWithThoseAboveIt) {
    const auto made = make("/run/nimbra/progress");

    ASSERT_TRUE(made) << made.error();
    EXPECT_EQ(*made, root() / "run/nimbra/progress");
    EXPECT_EQ(modeOf(*made), std::filesystem::perms::owner_all);
    EXPECT_NE(modeOf(root() / "run") & std::filesystem::perms::others_read,
              std::filesystem::perms::none);
}

TEST_F(FoldersTest, AFolderThatIsThereStaysAsItIs) {
    std::filesystem::create_directories(root() / "run/nimbra");
    const auto before = modeOf(root() / "run/nimbra");

    EXPECT_TRUE(make("/run/nimbra"));

    EXPECT_EQ(modeOf(root() / "run/nimbra"), before);
}

TEST_F(FoldersTest, ADeviceThatHasBeenRemovedDoesNotComeBack) {
    std::filesystem::remove(root());

    const auto made = make("/run/nimbra");

    ASSERT_FALSE(made);
    EXPECT_EQ(made.error().description,
              (root() / "run/nimbra").string() + ": cannot be made: No such file or directory");
    EXPECT_FALSE(std::filesystem::exists(root()));
}

TEST_F(FoldersTest, AFileInTheWayIsAnError) {
    std::ofstream(root() / "run") << "in the way";

    const auto made = make("/run/nimbra");

    ASSERT_FALSE(made);
    EXPECT_EQ(made.error().description,
              (root() / "run/nimbra").string() + ": cannot be made: Not a directory");
}

TEST_F(FoldersTest, AFileInItsPlaceIsAnError) {
    std::filesystem::create_directory(root() / "run");
    std::ofstream(root() / "run/nimbra") << "in its place";

    const auto made = make("/run/nimbra");

    ASSERT_FALSE(made);
    EXPECT_EQ(made.error().description,
              (root() / "run/nimbra").string() + ": cannot be made: Not a directory");
}

TEST_F(FoldersTest, ALinkLeadsToNoFolderOutsideTheDevice) {
    std::filesystem::create_directory_symlink("/elsewhere", root() / "run");

    const auto made = make("/run/nimbra");

    ASSERT_TRUE(made) << made.error();
    EXPECT_EQ(*made, root() / "elsewhere/nimbra");
    EXPECT_TRUE(std::filesystem::is_directory(root() / "elsewhere/nimbra"));
}

TEST_F(FoldersTest, AFolderOfNoPermissionsOfItsOwnIsForEverybodyToRead) {
    const auto made = makeFolder(DevicePaths(root()), "/run/nimbra");

    ASSERT_TRUE(made) << made.error();
    EXPECT_NE(modeOf(*made) & std::filesystem::perms::others_read, std::filesystem::perms::none);
}

TEST_F(FoldersTest, AFolderIsRemovedWithAllThatIsInIt) {
    std::filesystem::create_directories(root() / "run/nimbra/progress");
    std::ofstream(root() / "run/nimbra/progress/sync.json") << "{}";

    const auto removed = removeFolder(DevicePaths(root()), "/run/nimbra");

    EXPECT_TRUE(removed) << removed.error();
    EXPECT_FALSE(std::filesystem::exists(root() / "run/nimbra"));
    EXPECT_TRUE(std::filesystem::exists(root() / "run"));
}

TEST_F(FoldersTest, AFolderThatIsNotThereNeedNotBeRemoved) {
    EXPECT_TRUE(removeFolder(DevicePaths(root()), "/run/nimbra"));
}

TEST_F(FoldersTest, AFolderThatCannotBeRemovedIsAnError) {
    std::filesystem::create_directories(root() / "run/nimbra");
    std::filesystem::permissions(root().parent_path(), std::filesystem::perms(0755));
    std::expected<void, Error> removed;
    {
        const test::ReadOnly readOnly(root() / "run");
        removed = removeFolder(DevicePaths(root()), "/run/nimbra");
    }

    ASSERT_FALSE(removed);
    EXPECT_TRUE(std::filesystem::exists(root() / "run/nimbra"));
    EXPECT_EQ(removed.error().description,
              (root() / "run/nimbra").string() + ": cannot be removed: Permission denied");
}

} // namespace
} // namespace nimbra::device
