#include "device/apps/ApplicationFolders.h"

#include <algorithm>
#include <cstdlib>
#include <ranges>
#include <string_view>

namespace nimbra::device {

namespace {

/// The variable's value; empty counts as not set.
std::string valueOf(Environment environment, const char* name) {
    const char* const value = environment(name);
    return value == nullptr ? "" : value;
}

/// The folder of applications in the data directory `directory`.
std::string folderIn(std::string_view directory) {
    while (directory.size() > 1 && directory.ends_with('/')) {
        directory.remove_suffix(1);
    }
    return std::string(directory) + "/applications";
}

std::vector<std::string> dataDirectories(Environment environment) {
    std::vector<std::string> directories;
    const std::string dataHome = valueOf(environment, "XDG_DATA_HOME");
    // A path that is not absolute does not count.
    if (dataHome.starts_with('/')) {
        directories.push_back(dataHome);
    } else if (const std::string home = valueOf(environment, "HOME"); home.starts_with('/')) {
        directories.push_back(home + "/.local/share");
    }
    std::string others = valueOf(environment, "XDG_DATA_DIRS");
    if (others.empty()) {
        others = "/usr/local/share:/usr/share";
    }
    for (const auto directory : std::views::split(others, ':')) {
        if (const std::string_view path(directory.begin(), directory.end());
            path.starts_with('/')) {
            directories.emplace_back(path);
        }
    }
    return directories;
}

} // namespace

std::vector<std::string> applicationFolders(const DevicePaths& paths, Environment environment) {
    std::vector<std::string> folders;
    const auto add = [&folders](std::string folder) {
        if (std::ranges::find(folders, folder) == folders.end()) {
            folders.push_back(std::move(folder));
        }
    };
    if (paths.isThisMachine()) {
        for (const std::string& directory : dataDirectories(environment)) {
            add(folderIn(directory));
        }
    }
    add(std::string(kApplicationsDirectory));
    return folders;
}

const char* processEnvironment(const char* name) {
    return std::getenv(name);
}

} // namespace nimbra::device
