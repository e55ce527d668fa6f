#include "device/documents/DeviceFileManager.h"

#include <utility>

namespace nimbra::device {

DeviceFileManager::DeviceFileManager(DocumentsFile documents) : _documents(std::move(documents)) {}

Text DeviceFileManager::SystemRootDirectory() const {
    return "/";
}

Text DeviceFileManager::tidewaterIdentityToken() {
    const auto description = _documents.read();
    return description && description->identity ? Text(*description->identity) : Text();
}

} // namespace nimbra::device
