#include "device/system/DeviceRestrictions.h"

#include "device/description/DescriptionFiles.h"
#include "platform/system/SystemLog.h"

#include <utility>

namespace nimbra::device {

DeviceRestrictions::DeviceRestrictions(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _log(log) {}

bool DeviceRestrictions::isAppCellularDataModificationAllowed() const {
    const auto description = readDescriptionFile(_paths, restrictionsFile);
    if (!description) {
        _log.write(LogLevel::error,
                   "Can't read the restrictions: " + description.error().description);
        return false;
    }
    return description->appCellularDataModificationAllowed;
}

} // namespace nimbra::device
