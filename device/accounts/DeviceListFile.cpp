#include "device/accounts/DeviceListFile.h"

#include "device/DeviceError.h"
#include "device/description/DescriptionFiles.h"
#include "device/files/PlainFile.h"
#include "platform/system/SystemLog.h"

#include <cerrno>
#include <string>
#include <utility>

namespace nimbra::device {

DeviceListFile::DeviceListFile(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _log(log) {}

std::optional<DeviceDescription::DeviceList> DeviceListFile::read() const {
    auto list = content();
    if (!list) {
        _log.write(LogLevel::error, list.error().description);
        return std::nullopt;
    }
    return std::move(*list);
}

/// An error calls the file by its path on the device.
std::expected<DeviceDescription::DeviceList, Error> DeviceListFile::content() const {
    const auto path = _paths.resolve(kDeviceListFile);
    if (!path) {
        return std::unexpected(fileError(kDeviceListFile, "cannot be followed", path.error().code));
    }
    const auto text = readPlainFile(*path);
    if (!text && text.error().code == ENOENT) {
        return DeviceDescription::DeviceList();
    }
    if (!text) {
        return std::unexpected(withPath(text.error(), *path, kDeviceListFile));
    }
    auto description = readDescription(*text, std::string(kDeviceListFile), deviceListFile);
    if (!description) {
        return std::unexpected(std::move(description.error()));
    }
    return std::move(description->deviceList);
}

} // namespace nimbra::device
