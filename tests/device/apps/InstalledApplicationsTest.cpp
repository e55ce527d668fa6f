#include "device/apps/InstalledApplications.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using Applications = std::vector<InstalledApplication>;

class InstalledApplicationsTest : public testing::Test {
protected:
    void write(const std::string& devicePath, const std::string& rest = {}) const {
        test::writeTestFile(_directory.path() / devicePath,
                            "[Desktop Entry]\nType=Application\nName=Any\n" + rest);
    }
    [[nodiscard]] InstalledApplications read(const std::vector<std::string>& folders) const {
        return InstalledApplications::read(DevicePaths(_directory.path()), folders);
    }
    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(InstalledApplicationsTest, EveryEntryIsAnApplication) {
    write("usr/b.desktop");
    write("usr/a%2Fc.desktop", "Hidden=true\n");
    write("usr/other.txt");
    test::writeTestFile(root() / "usr/link.desktop", "[Desktop Entry]\nType=Link\nName=L\n");

    const auto installed = read({"/usr"});

    EXPECT_EQ(installed.applications, (Applications{{"a/c", true}, {"b", false}}));
    EXPECT_TRUE(installed.problems.empty());
}

TEST_F(InstalledApplicationsTest, TheBetterFolderCountsAndAMissingOneHasNone) {
    write("best/a.desktop", "Hidden=true\n");
    write("usr/a.desktop");

    EXPECT_EQ(read({"/missing", "/best", "/usr"}).applications, (Applications{{"a", true}}));
}

TEST_F(InstalledApplicationsTest, WhatCannotBeReadIsTold) {
    write("usr/a.desktop");
    std::filesystem::create_directory(root() / "usr/b.desktop");
    test::writeTestFile(root() / "file", "no folder");

    const auto installed = read({"/usr", "/file"});

    EXPECT_EQ(installed.applications, (Applications{{"a", false}}));
    ASSERT_EQ(installed.problems.size(), 2U);
    EXPECT_TRUE(installed.problems[0].description.starts_with((root() / "file").string()));
    EXPECT_TRUE(installed.problems[1].description.starts_with((root() / "usr/b.desktop").string()));
}

} // namespace
} // namespace nimbra::device
