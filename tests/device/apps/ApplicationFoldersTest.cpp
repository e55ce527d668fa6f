#include "device/apps/ApplicationFolders.h"

#include <gtest/gtest.h>
#include <string_view>

namespace nimbra::device {
namespace {

using Folders = std::vector<std::string>;

const char* noEnvironment(const char* /*name*/) {
    return nullptr;
}

const char* onlyHome(const char* name) {
    return name == std::string_view("HOME") ? "/users/anna" : nullptr;
}

const char* emptyVariables(const char* name) {
    return name == std::string_view("HOME") ? "/users/anna" : "";
}

const char* ownDirectories(const char* name) {
    if (name == std::string_view("XDG_DATA_HOME")) {
        return "/data/anna/";
    }
    return name == std::string_view("XDG_DATA_DIRS") ? "/opt/share:share:/srv//:/opt/share:"
                                                     : "/users/anna";
}

const char* relativeHomes(const char* name) {
    return name == std::string_view("XDG_DATA_DIRS") ? nullptr : "data";
}

TEST(ApplicationFoldersTest, ADeviceInADirectoryHasItsOwnFolderOnly) {
    EXPECT_EQ(applicationFolders(DevicePaths("/tmp/device"), ownDirectories),
              Folders{"/usr/share/applications"});
}

TEST(ApplicationFoldersTest, ThisMachineHasTheUsualFoldersOfTheUserAndTheSystem) {
    const Folders usual{"/users/anna/.local/share/applications", "/usr/local/share/applications",
                        "/usr/share/applications"};
    EXPECT_EQ(applicationFolders(DevicePaths("/"), onlyHome), usual);
    EXPECT_EQ(applicationFolders(DevicePaths("/"), emptyVariables), usual);
}

TEST(ApplicationFoldersTest, TheVariablesNameOtherFoldersBeforeTheDevicesOwn) {
    EXPECT_EQ(applicationFolders(DevicePaths("/"), ownDirectories),
              (Folders{"/data/anna/applications", "/opt/share/applications", "/srv/applications",
                       "/usr/share/applications"}));
}

TEST(ApplicationFoldersTest, APathThatIsNotAbsoluteDoesNotCount) {
    const Folders ofTheSystem{"/usr/local/share/applications", "/usr/share/applications"};
    EXPECT_EQ(applicationFolders(DevicePaths("/"), relativeHomes), ofTheSystem);
    EXPECT_EQ(applicationFolders(DevicePaths("/"), noEnvironment), ofTheSystem);
}

TEST(ApplicationFoldersTest, TheEnvironmentIsThatOfTheProcess) {
    EXPECT_NE(processEnvironment("PATH"), nullptr);
    EXPECT_EQ(processEnvironment("NIMBRA_NOT_SET"), nullptr);
}

} // namespace
} // namespace nimbra::device
