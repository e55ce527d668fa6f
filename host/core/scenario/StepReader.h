#pragma once

#include "host/core/scenario/Scenario.h"

namespace nimbra::device {
class JsonReader;
}

namespace nimbra::host {

/// Reads the step at `reader`; what is not as it should be is noted there.
[[nodiscard]] ScenarioStep readStep(const device::JsonReader& reader);

} // namespace nimbra::host
