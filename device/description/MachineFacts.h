#pragma once

#include "device/DeviceDescription.h"

#include <filesystem>

namespace nimbra::device {

/// What Linux tells of the machine whose root directory is `root`, for a real device on which
/// nobody has written it down: the pretty host name, or else the host name; cellular data where
/// there is a mobile broadband modem among the network interfaces; the locale and the time zone of
/// this process. The rest is the default.
[[nodiscard]] DeviceDescription describeMachine(const std::filesystem::path& root);

} // namespace nimbra::device
