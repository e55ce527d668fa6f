#pragma once

#include "platform/documents/DaemonConnection.h"

namespace nimbra::device {

/// Where the cloud's documents stand on every device.
inline constexpr const char* kMobileDocumentsURL = "file:///var/mobile/NimbraDrive/";

/// The daemon as a device knows it: its folder goes by the device's own path, wherever on this
/// machine the device's directory is. Any thread.
class DeviceDaemonConnection final : public DaemonConnection {
public:
    [[nodiscard]] std::string mobileDocumentsURL() const override { return kMobileDocumentsURL; }
};

} // namespace nimbra::device
