#include "device/documents/DeviceFileManager.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <gtest/gtest.h>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

using std::filesystem::perms;
using test::contentOf;
using test::treeOf;
using test::writeTestFile;
using Errors = std::vector<std::optional<Error>>;

/// While it lives, this process masks these permissions.
class Mask {
public:
    explicit Mask(mode_t mask) : _earlier(::umask(mask)) {}
    Mask(const Mask&) = delete;
    Mask& operator=(const Mask&) = delete;
    ~Mask() { ::umask(_earlier); }

private:
    mode_t _earlier;
};

class FilesOfTheDeviceTest : public testing::Test {
protected:
    FilesOfTheDeviceTest() {
        std::filesystem::create_directory(root());
        // Also for one who owns nothing here.
        std::filesystem::permissions(outside(), perms(0755));
    }

    [[nodiscard]] std::filesystem::path outside() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] DeviceFileManager& fileManager() { return _fileManager; }

    [[nodiscard]] std::expected<void, Error> make(const std::string& path, bool intermediates,
                                                  std::optional<mode_t> permissions = {}) {
        return _fileManager.createDirectoryAtPathWithIntermediateDirectoriesAttributes(
            path, intermediates, {.posixPermissions = permissions});
    }
    [[nodiscard]] perms modeOf(const std::string& below) const {
        return std::filesystem::status(root() / below).permissions();
    }
    [[nodiscard]] bool isThere(const std::string& below) const {
        return std::filesystem::exists(std::filesystem::symlink_status(root() / below));
    }

    static void expectError(const std::expected<void, Error>& result, const std::string& domain,
                            int code, const std::string& description) {
        ASSERT_FALSE(result);
        EXPECT_EQ(result.error(),
                  (Error{.domain = domain, .code = code, .description = description}));
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    DevicePaths _paths{_directory.path() / "device"};
    DeviceFileManager _fileManager{_paths, DocumentsFile(_paths, _log)};
};

TEST_F(FilesOfTheDeviceTest, AFolderGoesWithEverythingInItAndNothingElse) {
    writeTestFile(root() / "a/b/c", "c");
    writeTestFile(root() / "a/b/.d/e", "e");
    writeTestFile(root() / "a/f", "f");

    const auto removed = fileManager().removeItemAtPath("/a/b/");

    ASSERT_TRUE(removed) << removed.error();
    EXPECT_EQ(treeOf(root()),
              (std::map<std::string, std::string>{{"a", "directory"}, {"a/f", "f"}}));
}

TEST_F(FilesOfTheDeviceTest, AFileGoes) {
    writeTestFile(root() / "a", "a");

    EXPECT_TRUE(fileManager().removeItemAtPath("//a//"));

    EXPECT_FALSE(isThere("a"));
}

TEST_F(FilesOfTheDeviceTest, OfALinkTheLinkItselfGoes) {
    writeTestFile(root() / "kept/file", "kept");
    writeTestFile(outside() / "letter", "kept");
    std::filesystem::create_directory_symlink("kept", root() / "folder");
    std::filesystem::create_symlink(outside() / "letter", root() / "leads-out");
    std::filesystem::create_symlink("nowhere", root() / "dangling");
    std::filesystem::create_symlink("circle", root() / "circle");

    for (const char* const path : {"/folder/", "/leads-out", "/dangling", "/circle"}) {
        EXPECT_TRUE(fileManager().removeItemAtPath(path)) << path;
    }

    EXPECT_EQ(treeOf(root()),
              (std::map<std::string, std::string>{{"kept", "directory"}, {"kept/file", "kept"}}));
    EXPECT_EQ(contentOf(outside() / "letter"), "kept");
}

TEST_F(FilesOfTheDeviceTest, LinksAboveWhatIsRemovedStayOnTheDevice) {
    writeTestFile(outside() / "file", "not the device's");
    writeTestFile(root() / "file", "the device's");
    std::filesystem::create_directory_symlink("/", root() / "absolute");
    std::filesystem::create_directory_symlink("..", root() / "relative");

    EXPECT_TRUE(fileManager().removeItemAtPath("/absolute/../../relative/file"));

    EXPECT_FALSE(isThere("file"));
    EXPECT_EQ(contentOf(outside() / "file"), "not the device's");
}

TEST_F(FilesOfTheDeviceTest, WhereNothingStandsTheErrorSaysSo) {
    writeTestFile(root() / "file", "file");

    for (const std::string path : {"/nothing", "/nothing/below/", "/file/below"}) {
        expectError(fileManager().removeItemAtPath(path), PlatformErrorDomain, FileNoSuchFileError,
                    path + ": cannot be removed: No such file or directory");
    }
}

TEST_F(FilesOfTheDeviceTest, TheDevicesRootStays) {
    writeTestFile(root() / "file", "file");

    for (const std::string path : {"/", "//"}) {
        expectError(fileManager().removeItemAtPath(path), "POSIX", EBUSY,
                    path + ": cannot be removed: Device or resource busy");
    }
    for (const std::string path : {"/..", "/file/..", "/.", "/./", ""}) {
        expectError(fileManager().removeItemAtPath(path), "POSIX", EINVAL,
                    path + ": cannot be removed: Invalid argument");
    }
    EXPECT_TRUE(isThere("file"));
}

TEST_F(FilesOfTheDeviceTest, APathThatNoFileHasNamesNoOther) {
    writeTestFile(root() / "file", "file");
    std::filesystem::create_symlink("b", root() / "a");
    std::filesystem::create_symlink("a", root() / "b");
    const std::string withNull{"/file\0.txt", 10};

    expectError(fileManager().removeItemAtPath(withNull), "POSIX", EINVAL,
                "/file .txt: cannot be removed: Invalid argument");
    expectError(make(withNull, true), "POSIX", EINVAL,
                "/file .txt: cannot be made: Invalid argument");
    expectError(fileManager().removeItemAtPath("/a/file"), "POSIX", ELOOP,
                "/a/file: cannot be removed: Too many levels of symbolic links");
    expectError(make("/a/folder", true), "POSIX", ELOOP,
                "/a/folder: cannot be made: Too many levels of symbolic links");
    const std::string tooLong = '/' + std::string(256, 'x');
    expectError(fileManager().removeItemAtPath(tooLong), "POSIX", ENAMETOOLONG,
                tooLong + ": cannot be removed: File name too long");
    EXPECT_TRUE(isThere("file"));
}

TEST_F(FilesOfTheDeviceTest, WhatMayNotBeRemovedStays) {
    writeTestFile(root() / "locked/file", "file");
    const test::ReadOnly locked(root() / "locked");

    expectError(fileManager().removeItemAtPath("/locked/file"), "POSIX", EACCES,
                "/locked/file: cannot be removed: Permission denied");

    EXPECT_TRUE(isThere("locked/file"));
}

TEST_F(FilesOfTheDeviceTest, AFolderIsMadeWithThoseAboveIt) {
    const Mask mask(022);

    const auto made = make("/var/logs/tool/", true, 0777);

    ASSERT_TRUE(made) << made.error();
    EXPECT_EQ(modeOf("var"), perms(0755));
    EXPECT_EQ(modeOf("var/logs"), perms(0755));
    EXPECT_EQ(modeOf("var/logs/tool"), perms(0777));
}

TEST_F(FilesOfTheDeviceTest, PermissionsAreExactWhateverTheProcessMasks) {
    const Mask mask(0777);

    EXPECT_TRUE(make("/open", false, 0777));
    EXPECT_TRUE(make("/sticky", false, 01750));

    EXPECT_EQ(modeOf("open"), perms(0777));
    EXPECT_EQ(modeOf("sticky"), perms(01750));
}

TEST_F(FilesOfTheDeviceTest, AFolderWithoutPermissionsIsReadableByEverybodyAsFarAsNotMasked) {
    const Mask mask(027);

    EXPECT_TRUE(make("/usual", false));

    EXPECT_EQ(modeOf("usual"), perms(0750));
}

TEST_F(FilesOfTheDeviceTest, WithIntermediatesAFolderThatStandsThereWillDo) {
    std::filesystem::create_directories(root() / "a/b");
    std::filesystem::permissions(root() / "a/b", perms(0700));
    writeTestFile(root() / "a/b/file", "kept");
    std::filesystem::create_directory_symlink("a/b", root() / "link");

    EXPECT_TRUE(make("/a/b", true, 0777));
    EXPECT_TRUE(make("/link/", true));
    EXPECT_TRUE(make("/", true));

    EXPECT_EQ(modeOf("a/b"), perms(0700));
    EXPECT_EQ(contentOf(root() / "a/b/file"), "kept");
}

TEST_F(FilesOfTheDeviceTest, WithoutIntermediatesItIsAnError) {
    std::filesystem::create_directories(root() / "a");
    std::filesystem::create_directory_symlink("nowhere", root() / "link");

    expectError(make("/a/", false, 0777), "POSIX", EEXIST, "/a/: cannot be made: File exists");
    expectError(make("/link", false), "POSIX", EEXIST, "/link: cannot be made: File exists");
    expectError(make("/", false), "POSIX", EEXIST, "/: cannot be made: File exists");
    EXPECT_EQ(modeOf("a"), perms(0755));
    EXPECT_FALSE(isThere("nowhere"));
}

TEST_F(FilesOfTheDeviceTest, WithoutIntermediatesTheParentHasToBeThere) {
    expectError(make("/no/folder", false), "POSIX", ENOENT,
                "/no/folder: cannot be made: No such file or directory");

    EXPECT_TRUE(treeOf(root()).empty());
}

TEST_F(FilesOfTheDeviceTest, AFileInTheWayIsAnError) {
    writeTestFile(root() / "file", "kept");

    expectError(make("/file", true), "POSIX", EEXIST, "/file: cannot be made: File exists");
    expectError(make("/file", false), "POSIX", EEXIST, "/file: cannot be made: File exists");
    expectError(make("/file/below/it", true), "POSIX", EEXIST,
                "/file/below/it: cannot be made: File exists");
    expectError(make("/file/below", false), "POSIX", ENOTDIR,
                "/file/below: cannot be made: Not a directory");
    EXPECT_EQ(contentOf(root() / "file"), "kept");
}

TEST_F(FilesOfTheDeviceTest, AFolderIsNeverMadeOutsideTheDevice) {
    std::filesystem::create_directory_symlink(outside(), root() / "leads-out");

    EXPECT_TRUE(make("/leads-out/../../../folder", true));

    EXPECT_FALSE(std::filesystem::exists(outside() / "folder"));
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(outside()), {}), 1);
}

TEST_F(FilesOfTheDeviceTest, ARootThatHasGoneIsNotMadeAgain) {
    std::filesystem::remove(root());

    expectError(make("/a/b", true), "POSIX", ENOENT,
                "/a/b: cannot be made: No such file or directory");

    EXPECT_FALSE(std::filesystem::exists(root()));
}

TEST_F(FilesOfTheDeviceTest, WhereNothingMayBeMadeNothingIs) {
    std::filesystem::create_directory(root() / "locked");
    const test::ReadOnly locked(root() / "locked");

    expectError(make("/locked/a/b", true, 0777), "POSIX", EACCES,
                "/locked/a/b: cannot be made: Permission denied");
    EXPECT_FALSE(isThere("locked/a"));
}

TEST_F(FilesOfTheDeviceTest, AFileIsReachableWhenItIsThere) {
    writeTestFile(root() / "a/file", "");
    writeTestFile(outside() / "letter", "");
    std::filesystem::create_symlink("/a/file", root() / "link");
    std::filesystem::create_symlink("nowhere", root() / "dangling");

    for (const std::string path : {"/a/file", "/a/", "/link", "/../a/file"}) {
        EXPECT_TRUE(fileManager().isResourceReachable(FileURL(path))) << path;
    }
    for (const std::string& path :
         {std::string("/a/other"), std::string("/dangling"), std::string("/../letter"),
          std::string("/a/file/below"), std::string(), std::string("/a/file\0x", 9)}) {
        EXPECT_FALSE(fileManager().isResourceReachable(FileURL(path))) << path;
    }
}

TEST_F(FilesOfTheDeviceTest, AProgramIsGivenThePathOnThisMachine) {
    std::filesystem::create_directory_symlink("/real", root() / "link");
    const auto placeOf = [this](const std::string& path) {
        return fileManager().fileSystemRepresentation(FileURL(path));
    };

    EXPECT_EQ(placeOf("/a/L'Été 1.tar.gz"), (root() / "a/L'Été 1.tar.gz").string());
    EXPECT_EQ(placeOf("/link/../../b"), (root() / "b").string());
    EXPECT_EQ(placeOf("/link/c"), (root() / "real/c").string());
    EXPECT_EQ(placeOf(std::string("/a\0b", 4)), std::nullopt);
    EXPECT_EQ(placeOf(""), std::nullopt);
    std::filesystem::create_symlink("circle", root() / "circle");
    EXPECT_EQ(placeOf("/circle"), std::nullopt);
}

TEST_F(FilesOfTheDeviceTest, PlannedFailuresAreUsedUpInOrderAndTouchNothing) {
    const Error error{.domain = "D", .code = 7, .description = "planned"};
    writeTestFile(root() / "file", "");
    fileManager().planRemoveOutcomes({Error{.domain = "dropped"}});
    fileManager().planRemoveOutcomes({error, std::nullopt, error});
    fileManager().planCreateOutcomes({std::nullopt, error});

    expectError(fileManager().removeItemAtPath("/file"), "D", 7, "planned");
    EXPECT_TRUE(isThere("file"));
    EXPECT_TRUE(fileManager().removeItemAtPath("/file"));
    EXPECT_FALSE(isThere("file"));
    EXPECT_TRUE(make("/a", false));
    expectError(make("/b", false), "D", 7, "planned");
    EXPECT_FALSE(isThere("b"));
    EXPECT_TRUE(make("/b", false));
    expectError(fileManager().removeItemAtPath("/b"), "D", 7, "planned");
    EXPECT_TRUE(fileManager().removeItemAtPath("/b"));
}

} // namespace
} // namespace nimbra::device
