#pragma once

#include "device/DeviceDescription.h"
#include "device/files/DevicePaths.h"

#include <optional>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// What the cloud-documents daemon leaves in the device's `documents.json`. Any thread.
class DocumentsFile {
public:
    /// `log` is told when the file cannot be read and outlives this.
    DocumentsFile(DevicePaths paths, SystemLog& log);

    /// The file as it is now, in the description's part for documents; nothing, with a line in the
    /// log, when it cannot be read.
    [[nodiscard]] std::optional<DeviceDescription> read() const;

private:
    DevicePaths _paths;
    SystemLog& _log;
};

} // namespace nimbra::device
