#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string_view>

namespace nimbra::device {

// Where things stand on a device, as it names them itself.

inline constexpr std::string_view kStateDirectory = "/var/lib/nimbra";
inline constexpr std::string_view kAccountsDatabase = "/var/lib/nimbra/accounts.db";
inline constexpr std::string_view kConsentDatabase = "/var/lib/nimbra/consent.db";
inline constexpr std::string_view kDeviceFile = "/var/lib/nimbra/device.json";
inline constexpr std::string_view kRestrictionsFile = "/var/lib/nimbra/restrictions.json";
inline constexpr std::string_view kDocumentsFile = "/var/lib/nimbra/documents.json";
inline constexpr std::string_view kDeviceListFile = "/var/lib/nimbra/device-list.json";
inline constexpr std::string_view kPreferencesDirectory = "/var/lib/nimbra/preferences";
inline constexpr std::string_view kRunningApplicationsDirectory = "/run/nimbra";
inline constexpr std::string_view kPriorityHintsDirectory = "/run/nimbra/priority-hints";
inline constexpr std::string_view kProgressDirectory = "/run/nimbra/progress";
inline constexpr std::string_view kNotificationsDirectory = "/run/nimbra/notifications";
inline constexpr std::string_view kApplicationsDirectory = "/usr/share/applications";
inline constexpr std::string_view kDatabaseSettingsBundle =
    "/System/Library/PreferenceBundles/AccountSettings/TessarySettings.bundle";
inline constexpr std::string_view kToolDirectory = "/usr/bin";
inline constexpr std::string_view kTool = "/usr/bin/mrctl";
inline constexpr std::string_view kLogFile = "/var/log/nimbra/settings.log";

/// Turns a path on the device into one of this machine: the last step before the file system.
class DevicePaths {
public:
    /// The device whose root directory is `root`.
    explicit DevicePaths(std::filesystem::path root);

    [[nodiscard]] const std::filesystem::path& root() const { return _root; }
    /// Whether the device is the machine that this process runs on, not a directory that is laid
    /// out like one.
    [[nodiscard]] bool isThisMachine() const { return _root == "/"; }

    /// `devicePath` below the root, its links followed as the device itself would: ".." stops at
    /// the root, and a link's target starts there. What does not exist (yet) is taken as written.
    /// More than 40 links on the way, as those that lead round in a circle, are the error ELOOP.
    [[nodiscard]] std::expected<std::filesystem::path, Error>
    resolve(std::string_view devicePath) const;

    /// `error`, where its description begins with a place below the root, with the place as the
    /// device itself names it: where the root stands on this machine concerns no page and no log of
    /// the device.
    [[nodiscard]] Error asTheDeviceSaysIt(Error error) const;

private:
    std::filesystem::path _root;
};

} // namespace nimbra::device
