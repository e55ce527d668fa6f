#include "device/system/DeviceRestrictions.h"

#include "device/description/DescriptionFiles.h"
#include "device/files/PlainFile.h"
#include "platform/system/SystemLog.h"

#include <set>
#include <system_error>
#include <utility>

namespace nimbra::device {

struct DeviceRestrictions::Restrictions {
    std::set<std::string> cloudSyncDenied;
    bool appCellularDataModificationAllowed = true;
};

DeviceRestrictions::DeviceRestrictions(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _path((_paths.root() / kRestrictionsFile.substr(1)).string()),
      _log(log) {}

DeviceRestrictions::~DeviceRestrictions() = default;

bool DeviceRestrictions::isAppCellularDataModificationAllowed() const {
    const std::scoped_lock lock(_mutex);
    const Restrictions* restrictions = current();
    return restrictions != nullptr && restrictions->appCellularDataModificationAllowed;
}

bool DeviceRestrictions::isCloudSyncAllowed(const BundleIdentifier& bundle) const {
    const std::scoped_lock lock(_mutex);
    const Restrictions* restrictions = current();
    return restrictions != nullptr && !restrictions->cloudSyncDenied.contains(bundle.string());
}

const DeviceRestrictions::Restrictions* DeviceRestrictions::current() const {
    const auto isUnchanged = [this](const std::string& path) {
        const auto stamp = stampOfPlainFile(path);
        return stamp && _version.stillHolds(*stamp);
    };
    // The same stamp is the same file, whichever way leads to it.
    if (isUnchanged(_path)) {
        return _restrictions.get();
    }
    const auto path = _paths.resolve(kRestrictionsFile);
    if (!path) {
        fail(std::nullopt, path.error());
    } else if (!isUnchanged(*path)) {
        read(*path);
    }
    return _restrictions.get();
}

void DeviceRestrictions::read(const std::filesystem::path& path) const {
    std::error_code failure;
    if (_paths.isThisMachine() && !std::filesystem::exists(path, failure) && !failure) {
        // A machine that nobody manages.
        _restrictions = std::make_unique<const Restrictions>();
        _version = FileVersion();
        _problem.clear();
        return;
    }
    const auto stamp = stampOfPlainFile(path);
    const auto file = PlainFile::read(path, kMostBytesOfFile, path.string());
    if (!file) {
        fail(stamp, file.error());
        return;
    }
    auto description = readDescription(file->content, path.string(), restrictionsFile);
    if (!description) {
        fail(file->version.stamp(), description.error());
        return;
    }
    _restrictions = std::make_unique<const Restrictions>(Restrictions{
        .cloudSyncDenied = std::move(description->cloudSyncDenied),
        .appCellularDataModificationAllowed = description->appCellularDataModificationAllowed});
    _version = file->version;
    _problem.clear();
}

void DeviceRestrictions::fail(const std::optional<FileStamp>& stamp, Error error) const {
    const std::string problem = _paths.asTheDeviceSaysIt(std::move(error)).description;
    if (problem != _problem || stamp != _version.stamp()) {
        _log.write(LogLevel::error, "Can't read the restrictions: " + problem);
    }
    _restrictions.reset();
    _version = stamp ? FileVersion::unread(*stamp) : FileVersion();
    _problem = problem;
}

} // namespace nimbra::device
