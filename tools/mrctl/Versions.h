#pragma once

#include "tools/mrctl/DeviceContents.h"

#include <nlohmann/json.hpp>

namespace nimbra::mrctl {

/// The versions of this program, of the databases' forms, of the kernel and of libraries.
[[nodiscard]] nlohmann::ordered_json versionsOf(const DeviceContents& contents);

} // namespace nimbra::mrctl
