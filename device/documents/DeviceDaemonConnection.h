#pragma once

#include "platform/documents/DaemonConnection.h"

namespace nimbra::device {

/// The daemon as a device knows it: its folder goes by the device's own path, wherever on this
/// machine the device's directory is. Any thread.
class DeviceDaemonConnection final : public DaemonConnection {
public:
    [[nodiscard]] std::string mobileDocumentsURL() const override {
        return "file:///var/mobile/NimbraDrive/";
    }
};

} // namespace nimbra::device
