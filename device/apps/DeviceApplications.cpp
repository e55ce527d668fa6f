#include "device/apps/DeviceApplications.h"

#include "device/DeviceError.h"
#include "device/apps/DesktopLocales.h"
#include "device/files/ApplicationFileName.h"
#include "device/files/PlainFile.h"
#include "device/system/DeviceSettings.h"
#include "device/system/LanguageChain.h"
#include "platform/system/SystemLog.h"

#include <cerrno>
#include <string_view>
#include <sys/stat.h>
#include <utility>

namespace nimbra::device {

namespace {

// No entry that somebody wrote comes near it.
constexpr std::size_t largestEntry = 1'000'000;

} // namespace

/// Something in a folder, links above it followed.
struct DeviceApplications::Place {
    std::string path;
    FileStamp stamp;
    bool isLink = false;
};

DeviceApplications::DeviceApplications(DevicePaths paths, std::vector<std::string> folders,
                                       const DeviceSettings& settings, SystemLog& log)
    : _paths(std::move(paths)), _settings(settings), _log(log) {
    for (std::string& folder : folders) {
        std::string path = (_paths.root() / std::string_view(folder).substr(1)).string();
        _folders.push_back({.devicePath = std::move(folder),
                            .path = std::move(path),
                            .directory = {},
                            .problem = {}});
    }
}

std::shared_ptr<const AppProxy>
DeviceApplications::applicationProxyForIdentifier(const BundleIdentifier& identifier) {
    const std::string name = applicationFileName(identifier.string(), ".desktop");
    const std::scoped_lock lock(_mutex);
    useLocale(_settings.localeIdentifier());
    for (Folder& folder : _folders) {
        if (const Known* known = find(folder, name, identifier)) {
            return known->application;
        }
    }
    _index.erase(identifier);
    return nullptr;
}

void DeviceApplications::useLocale(std::string locale) {
    if (locale == _locale) {
        return;
    }
    _localeNames = desktopLocaleNames(languageChain(locale));
    _locale = std::move(locale);
    for (auto& [identifier, known] : _index) {
        // What was logged of a version stays known.
        known.version.forget();
        known.application = nullptr;
    }
}

const DeviceApplications::Known* DeviceApplications::find(Folder& folder, const std::string& name,
                                                          const BundleIdentifier& identifier) {
    const auto known = _index.find(identifier);
    const auto isUnchanged = [&](const std::string& path) {
        const auto stamp = known == _index.end() ? std::nullopt : stampOfPlainFile(path);
        return stamp && known->second.version.stillHolds(*stamp);
    };
    // One call for nearly every application: the same stamp is the same file, whichever way leads
    // to it, so that nothing needs to be resolved.
    if (isUnchanged(folder.path + '/' + name)) {
        return &known->second;
    }
    const auto place = placeOf(folder, name);
    if (!place) {
        return nullptr;
    }
    const std::string devicePath = folder.devicePath + '/' + name;
    const auto path = place->isLink ? _paths.resolve(devicePath) : place->path;
    if (path && isUnchanged(*path)) {
        return &known->second;
    }
    Known found;
    if (path) {
        found = read(*path, devicePath, identifier);
    } else {
        found.problem = fileError(devicePath, "cannot be read", path.error().code).description;
    }
    if (!found.version.stamp()) {
        found.version = FileVersion::unread(place->stamp);
    }
    return remember(identifier, std::move(found));
}

/// The folder's path on this machine, the device's links followed, or the number of the error.
std::expected<std::string, int> DeviceApplications::directoryOf(Folder& folder) const {
    const auto directoryAt = [](const std::string& path) -> std::optional<FileStamp> {
        struct stat status{};
        if (::stat(path.c_str(), &status) != 0) {
            return std::nullopt;
        }
        // Only which one it is: entries come and go.
        return FileStamp{.device = status.st_dev, .inode = status.st_ino};
    };
    // As with files: the same directory has the same entries, whichever way leads to it.
    if (folder.directory && directoryAt(folder.path) == folder.directory) {
        return folder.path;
    }
    const auto resolved = _paths.resolve(folder.devicePath);
    if (!resolved) {
        return std::unexpected(resolved.error().code);
    }
    folder.directory = directoryAt(*resolved);
    return resolved->string();
}

std::optional<DeviceApplications::Place> DeviceApplications::placeOf(Folder& folder,
                                                                     const std::string& name) {
    int number = 0;
    struct stat status{};
    std::string path;
    if (const auto directory = directoryOf(folder); !directory) {
        number = directory.error();
    } else if (path = *directory + '/' + name; ::lstat(path.c_str(), &status) != 0) {
        number = errno;
    }
    std::string problem;
    // A name that is too long is one that no file has.
    if (number != 0 && number != ENOENT && number != ENAMETOOLONG) {
        problem = fileError(folder.devicePath, "cannot be searched", number).description;
    }
    if (!problem.empty() && problem != folder.problem) {
        _log.write(LogLevel::error, "Can't look for applications: " + problem);
    }
    folder.problem = std::move(problem);
    if (number != 0) {
        return std::nullopt;
    }
    return Place{
        .path = std::move(path), .stamp = stampOf(status), .isLink = S_ISLNK(status.st_mode)};
}

DeviceApplications::Known DeviceApplications::read(const std::string& path,
                                                   const std::string& devicePath,
                                                   const BundleIdentifier& identifier) const {
    const auto file = PlainFile::read(path, largestEntry, devicePath);
    if (!file) {
        return {.version = {}, .application = {}, .problem = file.error().description};
    }
    DesktopEntry entry = DesktopEntry::read(file->content, _localeNames);
    Known known{.version = file->version, .application = {}, .problem = {}};
    if (!entry.problems.empty()) {
        const auto& [line, what] = entry.problems.front();
        const std::size_t others = entry.problems.size() - 1;
        known.problem = oneLine(devicePath) + ": line " + std::to_string(line) + ": " + what;
        if (others > 0) {
            known.problem += " (and " + std::to_string(others) + " more)";
        }
    }
    if (entry.isApplication) {
        known.application = std::make_shared<DeviceAppProxy>(identifier, std::move(entry));
    }
    return known;
}

const DeviceApplications::Known* DeviceApplications::remember(const BundleIdentifier& identifier,
                                                              Known known) {
    Known& kept = _index[identifier];
    const bool isNew =
        kept.version.stamp() != known.version.stamp() || kept.problem != known.problem;
    if (isNew && !known.problem.empty()) {
        _log.write(LogLevel::error, "Bad desktop entry: " + known.problem);
    }
    kept = std::move(known);
    return &kept;
}

} // namespace nimbra::device
