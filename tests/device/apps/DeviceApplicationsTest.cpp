#include "tests/device/apps/ApplicationsFixture.h"

#include <sys/stat.h>
#include <unistd.h>

namespace nimbra::device {
namespace {

using DeviceApplicationsTest = ApplicationsFixture;

TEST_F(DeviceApplicationsTest, AnApplicationIsWhatItsEntrySays) {
    write("com.a", "Name=Notes\nIcon=notes\nX-Nimbra-Entitlements={\"hidden\": true}\n");

    const auto application = std::dynamic_pointer_cast<const DeviceAppProxy>(find("com.a"));

    ASSERT_TRUE(application);
    EXPECT_EQ(application->localizedName(), Text("Notes"));
    EXPECT_EQ(application->icon(), Text("notes"));
    EXPECT_EQ(application->entitlements(), (Entitlements{{"hidden", {true}}}));
    EXPECT_FALSE(application->isRemovedSystemApp());
    EXPECT_EQ(log(), Lines());
}

TEST_F(DeviceApplicationsTest, AHiddenEntryIsARemovedApplication) {
    write("com.a", "Name=Notes\nHidden=true\n");

    ASSERT_TRUE(find("com.a"));
    EXPECT_TRUE(find("com.a")->isRemovedSystemApp());
}

TEST_F(DeviceApplicationsTest, ThereIsNoApplicationWithoutAnEntry) {
    EXPECT_EQ(find("com.a"), nullptr);
    EXPECT_EQ(find(""), nullptr);
    EXPECT_EQ(find(std::string(5000, 'a')), nullptr);
    write("com.link", "Type=Link\nURL=https://example.org/\n");
    EXPECT_EQ(find("com.link"), nullptr);
    std::filesystem::remove_all(root() / "usr");
    EXPECT_EQ(find("com.link"), nullptr);
    EXPECT_EQ(log(), Lines());
}

TEST_F(DeviceApplicationsTest, AnIdentifierIsNeverAPath) {
    test::writeTestFile(root() / "usr/share/secret.desktop", "[Desktop Entry]\nName=Secret\n");
    write("%2E%2E%2Fsecret", "Name=Encoded\n");

    EXPECT_EQ(find("../secret"), nullptr);
    EXPECT_EQ(find("x/../../secret"), nullptr);
}

TEST_F(DeviceApplicationsTest, WithoutANameItGoesByItsIdentifier) {
    write("com.a", "Icon=a\n");
    write("com.b", "Name= \n");

    EXPECT_EQ(nameOf("com.a"), "com.a");
    EXPECT_EQ(nameOf("com.b"), "com.b");
    EXPECT_EQ(log(),
              (Lines{"Bad desktop entry: /usr/share/applications/com.a.desktop: line 1: no usable "
                     "Name",
                     "Bad desktop entry: /usr/share/applications/com.b.desktop: line 2: no usable "
                     "Name"}));
}

TEST_F(DeviceApplicationsTest, WhatIsNoFileIsLeftOut) {
    std::filesystem::create_directory(file("com.folder"));
    expectLeftOut("com.folder", "is a directory");
    ASSERT_EQ(::mkfifo(file("com.pipe").c_str(), 0644), 0);
    expectLeftOut("com.pipe", "is not a plain file");
}

TEST_F(DeviceApplicationsTest, AFileOfTenMegabytesIsLeftOut) {
    write("com.large", "Name=Large\n" + std::string(10'000'000, '#'));
    expectLeftOut("com.large", "is larger than 1000000 bytes");
    write("com.large", "Name=Small\n");
    EXPECT_EQ(nameOf("com.large"), "Small");
}

TEST_F(DeviceApplicationsTest, AFileWithoutTheGroupIsLeftOut) {
    test::writeTestFile(file("com.empty"), "");
    expectLeftOut("com.empty", "line 1: no group [Desktop Entry]");
}

TEST_F(DeviceApplicationsTest, ALinkThatLeadsNowhereIsLeftOut) {
    std::filesystem::create_symlink("missing", file("com.dangling"));
    expectLeftOut("com.dangling", "cannot be read: No such file or directory");
    std::filesystem::create_symlink("com.round.desktop", file("com.round"));
    expectLeftOut("com.round", "cannot be read: Too many levels of symbolic links");
}

TEST_F(DeviceApplicationsTest, ALinkOutOfTheDeviceLeadsNowhere) {
    test::writeTestFile(outside() / "a.desktop", "[Desktop Entry]\nName=Outside\n");
    std::filesystem::create_symlink(outside() / "a.desktop", file("com.absolute"));
    std::filesystem::create_symlink("../../../../outside/a.desktop", file("com.relative"));

    expectLeftOut("com.absolute", "cannot be read: No such file or directory");
    expectLeftOut("com.relative", "cannot be read: No such file or directory");
}

TEST_F(DeviceApplicationsTest, ALinkIsFollowedAsTheDeviceWould) {
    test::writeTestFile(root() / "opt/a.desktop", "[Desktop Entry]\nName=First\n");
    test::writeTestFile(root() / "opt/b.desktop", "[Desktop Entry]\nName=Second\n");
    std::filesystem::create_symlink("/opt/a.desktop", file("com.a"));
    EXPECT_EQ(nameOf("com.a"), "First");

    test::writeTestFile(root() / "opt/a.desktop", "[Desktop Entry]\nName=Third\n");
    EXPECT_EQ(nameOf("com.a"), "Third");

    std::filesystem::remove(file("com.a"));
    std::filesystem::create_symlink("../../../opt/b.desktop", file("com.a"));
    EXPECT_EQ(nameOf("com.a"), "Second");
    EXPECT_EQ(log(), Lines());
}

/// For root every file can be read: it becomes somebody else for a while.
class Unprivileged {
public:
    Unprivileged() {
        constexpr uid_t nobody = 65534;
        if (::geteuid() == 0) {
            EXPECT_EQ(::seteuid(nobody), 0);
        }
    }
    Unprivileged(const Unprivileged&) = delete;
    Unprivileged& operator=(const Unprivileged&) = delete;
    ~Unprivileged() {
        if (::getuid() == 0) {
            EXPECT_EQ(::seteuid(0), 0);
        }
    }
};

TEST_F(DeviceApplicationsTest, AFileThatMayNotBeReadIsLeftOut) {
    write("com.locked", "Name=Locked\n");
    write("com.other", "Name=Other\n");
    std::filesystem::permissions(root().parent_path(), std::filesystem::perms(0755));
    std::filesystem::permissions(file("com.locked"), std::filesystem::perms::none);
    {
        const Unprivileged somebody;
        EXPECT_EQ(nameOf("com.locked"), "none");
        EXPECT_EQ(nameOf("com.locked"), "none");
        EXPECT_EQ(nameOf("com.other"), "Other");
    }
    EXPECT_EQ(log(), Lines{"Bad desktop entry: /usr/share/applications/com.locked.desktop: cannot "
                           "be read: Permission denied"});
    std::filesystem::permissions(file("com.locked"), std::filesystem::perms(0644));
    EXPECT_EQ(nameOf("com.locked"), "Locked");
}

TEST_F(DeviceApplicationsTest, AFolderThatMayNotBeSearchedIsLoggedOnce) {
    write("com.a", "Name=A\n");
    std::filesystem::permissions(root().parent_path(), std::filesystem::perms(0755));
    std::filesystem::permissions(folder(), std::filesystem::perms::none);
    {
        const Unprivileged somebody;
        EXPECT_EQ(nameOf("com.a"), "none");
        EXPECT_EQ(nameOf("com.b"), "none");
    }
    std::filesystem::permissions(folder(), std::filesystem::perms(0755));
    EXPECT_EQ(nameOf("com.a"), "A");
    std::filesystem::remove_all(folder());
    std::filesystem::create_symlink("applications", folder());
    EXPECT_EQ(nameOf("com.a"), "none");
    EXPECT_EQ(nameOf("com.b"), "none");
    const std::string start = "Can't look for applications: /usr/share/applications: cannot be "
                              "searched: ";
    EXPECT_EQ(log(),
              (Lines{start + "Permission denied", start + "Too many levels of symbolic links"}));
}

TEST_F(DeviceApplicationsTest, OfSeveralFoldersTheFirstWithTheEntryCounts) {
    const std::filesystem::path first = outside() / "first";
    const std::filesystem::path second = outside() / "second";
    open(DevicePaths("/"), {first.string(), second.string()});
    EXPECT_EQ(nameOf("com.a"), "none");

    test::writeTestFile(second / "com.a.desktop", "[Desktop Entry]\nName=Second\n");
    EXPECT_EQ(nameOf("com.a"), "Second");

    test::writeTestFile(first / "com.a.desktop", "[Desktop Entry]\nName=First\n");
    EXPECT_EQ(nameOf("com.a"), "First");

    test::writeTestFile(first / "com.a.desktop", "[Desktop Entry]\nHidden=true\n");
    ASSERT_TRUE(find("com.a"));
    EXPECT_TRUE(find("com.a")->isRemovedSystemApp());

    std::filesystem::remove(first / "com.a.desktop");
    std::filesystem::create_symlink("missing", first / "com.a.desktop");
    EXPECT_EQ(nameOf("com.a"), "none");

    std::filesystem::remove(first / "com.a.desktop");
    EXPECT_EQ(nameOf("com.a"), "Second");
}

} // namespace
} // namespace nimbra::device
