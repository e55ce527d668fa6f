#pragma once

#include "tools/mrctl/DeviceContents.h"

#include <nlohmann/json.hpp>
#include <string>

namespace nimbra::mrctl {

// What the document service knows, for whoever uses the device: nothing is left out or replaced.

[[nodiscard]] std::string statusText(const DeviceContents& contents);
[[nodiscard]] nlohmann::ordered_json statusAsJson(const DeviceContents& contents);

} // namespace nimbra::mrctl
