#pragma once

#include "device/DeviceDescription.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <optional>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// What an account's service would say of the account's devices, in the device's
/// `device-list.json`. Any thread.
class DeviceListFile {
public:
    /// `log` is told when the file cannot be read and outlives this.
    DeviceListFile(DevicePaths paths, SystemLog& log);

    /// The file as it is now; nothing, with a line in the log, when it cannot be read. On a device
    /// without the file the service knows of no devices.
    [[nodiscard]] std::optional<DeviceDescription::DeviceList> read() const;

private:
    [[nodiscard]] std::expected<DeviceDescription::DeviceList, Error> content() const;

    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
