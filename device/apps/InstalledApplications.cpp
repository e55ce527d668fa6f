#include "device/apps/InstalledApplications.h"

#include "device/apps/DesktopEntry.h"
#include "device/files/ApplicationFileName.h"
#include "device/files/Files.h"
#include "device/files/PlainFile.h"

#include <cerrno>
#include <cstddef>
#include <map>
#include <utility>

namespace nimbra::device {

namespace {

// No entry that somebody wrote comes near it.
constexpr std::size_t largestEntry = 1'000'000;

/// The paths on the device of the entries in `folders`, by the identifiers of their applications.
std::map<std::string, std::string> entriesIn(const DevicePaths& paths,
                                             const std::vector<std::string>& folders,
                                             std::vector<Error>& problems) {
    std::map<std::string, std::string> entries;
    for (const std::string& folder : folders) {
        const auto directory = paths.resolve(folder);
        const auto files =
            directory ? entriesOfDirectory(*directory) : std::unexpected(directory.error());
        if (!files) {
            if (files.error().code != ENOENT) {
                problems.push_back(files.error());
            }
            continue;
        }
        for (const std::filesystem::path& file : *files) {
            const std::string name = file.filename();
            if (auto identifier = applicationOfFileName(name, ".desktop")) {
                std::string path = folder;
                path.append("/").append(name);
                entries.emplace(std::move(*identifier), std::move(path));
            }
        }
    }
    return entries;
}

} // namespace

InstalledApplications InstalledApplications::read(const DevicePaths& paths,
                                                  const std::vector<std::string>& folders) {
    InstalledApplications result;
    for (const auto& [identifier, devicePath] : entriesIn(paths, folders, result.problems)) {
        const auto path = paths.resolve(devicePath);
        const auto file = path ? PlainFile::read(*path, largestEntry, path->string())
                               : std::unexpected(path.error());
        if (!file) {
            result.problems.push_back(file.error());
            continue;
        }
        const DesktopEntry entry = DesktopEntry::read(file->content, {});
        if (entry.isApplication) {
            result.applications.push_back({.identifier = identifier, .isHidden = entry.isHidden});
        }
    }
    return result;
}

} // namespace nimbra::device
