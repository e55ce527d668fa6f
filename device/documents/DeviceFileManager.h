#pragma once

#include "device/documents/DocumentsFile.h"
#include "platform/system/FileManager.h"

namespace nimbra::device {

/// The device's files. Any thread.
class DeviceFileManager final : public FileManager {
public:
    explicit DeviceFileManager(DocumentsFile documents);

    [[nodiscard]] Text SystemRootDirectory() const override;
    [[nodiscard]] Text tidewaterIdentityToken() override;

private:
    DocumentsFile _documents;
};

} // namespace nimbra::device
