#pragma once

#include "host/core/scenario/Scenario.h"
#include "platform/values/Error.h"

#include <expected>
#include <string>
#include <string_view>

namespace nimbra::host {

/// The scenario in `text`, which messages call `name`. All of it is checked, also what this version
/// does not use: the error names the first place that is not as it should be.
[[nodiscard]] std::expected<Scenario, Error> readScenario(std::string_view text,
                                                          const std::string& name);

} // namespace nimbra::host
