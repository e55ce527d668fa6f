#include "device/files/Folders.h"

#include "tests/support/TemporaryDirectory.h"

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

TEST_F(FoldersTest, ALinkLeadsToNoFolderOutsideTheDevice) {
    std::filesystem::create_directory_symlink("/elsewhere", root() / "run");

    const auto made = make("/run/nimbra");

    ASSERT_TRUE(made) << made.error();
    EXPECT_EQ(*made, root() / "elsewhere/nimbra");
    EXPECT_TRUE(std::filesystem::is_directory(root() / "elsewhere/nimbra"));
}

} // namespace
} // namespace nimbra::device
