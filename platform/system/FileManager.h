#pragma once

#include "platform/values/Text.h"

namespace nimbra {

/// The device's files, as far as the pane asks for them. Any queue.
class FileManager {
public:
    virtual ~FileManager() = default;

    /// The directory that holds everything on the device, by the device's own name for it.
    [[nodiscard]] virtual Text SystemRootDirectory() const = 0;

    /// Stands for the cloud-document identity that is signed in; absent when there is none.
    [[nodiscard]] virtual Text tidewaterIdentityToken() = 0;
};

} // namespace nimbra
