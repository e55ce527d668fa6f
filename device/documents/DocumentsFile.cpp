#include "device/documents/DocumentsFile.h"

#include "device/description/DescriptionFiles.h"
#include "platform/system/SystemLog.h"

#include <utility>

namespace nimbra::device {

DocumentsFile::DocumentsFile(DevicePaths paths, SystemLog& log)
    : _paths(std::move(paths)), _log(log) {}

std::optional<DeviceDescription> DocumentsFile::read() const {
    auto description = readDescriptionFile(_paths, documentsFile);
    if (!description) {
        _log.write(LogLevel::error, _paths.asTheDeviceSaysIt(description.error()).description);
        return std::nullopt;
    }
    return std::move(*description);
}

} // namespace nimbra::device
