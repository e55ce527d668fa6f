#pragma once

#include "device/files/DevicePaths.h"
#include "device/files/FileStamp.h"
#include "platform/system/RestrictionsProfile.h"

#include <filesystem>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// The restrictions of `restrictions.json`, which is read again when it has changed: whoever
/// manages the device may do so at any time. Any thread.
class DeviceRestrictions final : public RestrictionsProfile {
public:
    /// A file that cannot be read is told to `log`, once for each of its versions. `log` is not
    /// owned and outlives the profile.
    DeviceRestrictions(DevicePaths paths, SystemLog& log);
    ~DeviceRestrictions() override;

    // While the file cannot be read nothing is allowed: it may be forbidden.

    [[nodiscard]] bool isAppCellularDataModificationAllowed() const override;
    [[nodiscard]] bool isCloudSyncAllowed(const BundleIdentifier& bundle) const override;

private:
    struct Restrictions;

    /// What holds now; null where the file cannot be read. The mutex is held.
    [[nodiscard]] const Restrictions* current() const;
    void read(const std::filesystem::path& path) const;
    void fail(const std::optional<FileStamp>& stamp, Error error) const;

    DevicePaths _paths;
    /// The file's path on this machine as it is written, the device's links not followed.
    std::string _path;
    SystemLog& _log;
    mutable std::mutex _mutex;
    mutable std::unique_ptr<const Restrictions> _restrictions;
    mutable FileVersion _version;
    /// What was logged of the version; empty where it could be read.
    mutable std::string _problem;
};

} // namespace nimbra::device
