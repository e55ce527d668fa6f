#pragma once

#include "device/files/DevicePaths.h"
#include "platform/system/RestrictionsProfile.h"

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// The restrictions of `restrictions.json`, read at each question: whoever manages the device may
/// change them at any time. Any thread.
class DeviceRestrictions final : public RestrictionsProfile {
public:
    /// A file that cannot be read is told to `log`, which is not owned and outlives the profile.
    DeviceRestrictions(DevicePaths paths, SystemLog& log);

    /// False while the file cannot be read: what may be forbidden is not allowed.
    [[nodiscard]] bool isAppCellularDataModificationAllowed() const override;

private:
    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
