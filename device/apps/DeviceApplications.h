#pragma once

#include "device/apps/DeviceAppProxy.h"
#include "device/files/DevicePaths.h"
#include "device/files/FileStamp.h"
#include "platform/apps/Applications.h"

#include <expected>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

class DeviceSettings;

/// The applications of a device, one for each desktop entry in its folders. Any thread.
///
/// An entry is read when its application is first asked for, and again when its file or the user's
/// locale has changed. What is wrong with a file is logged once for each of its versions; one that
/// cannot be read at all is no application. Of two entries with the same name, the one in the
/// better folder counts, whatever is in it.
class DeviceApplications final : public Applications {
public:
    /// `folders` are paths on the device, the best first. Neither `settings` nor `log` is owned;
    /// both outlive it.
    DeviceApplications(DevicePaths paths, std::vector<std::string> folders,
                       const DeviceSettings& settings, SystemLog& log);

    [[nodiscard]] std::shared_ptr<const AppProxy>
    applicationProxyForIdentifier(const BundleIdentifier& identifier) override;

private:
    struct Folder {
        std::string devicePath;
        /// On this machine, the device's links not followed.
        std::string path;
        /// The directory to which they led when that was looked for.
        std::optional<FileStamp> directory;
        /// What was last logged of it; empty while all is well.
        std::string problem;
    };
    struct Place;
    /// What is known of an application's file.
    struct Known {
        FileVersion version;
        /// Null where the file describes no application.
        std::shared_ptr<const DeviceAppProxy> application;
        /// What was logged of this version; empty where all is well.
        std::string problem;
    };

    void useLocale(std::string locale);
    /// What is known of the entry `name` in `folder`, kept in the index; null where there is none.
    [[nodiscard]] const Known* find(Folder& folder, const std::string& name,
                                    const BundleIdentifier& identifier);
    [[nodiscard]] std::expected<std::string, int> directoryOf(Folder& folder) const;
    [[nodiscard]] std::optional<Place> placeOf(Folder& folder, const std::string& name);
    [[nodiscard]] Known read(const std::string& path, const std::string& devicePath,
                             const BundleIdentifier& identifier) const;
    const Known* remember(const BundleIdentifier& identifier, Known known);

    DevicePaths _paths;
    std::vector<Folder> _folders;
    const DeviceSettings& _settings;
    SystemLog& _log;

    std::mutex _mutex;
    std::string _locale;
    /// The user's languages as desktop entries call them.
    std::vector<std::string> _localeNames;
    std::unordered_map<BundleIdentifier, Known> _index;
};

} // namespace nimbra::device
