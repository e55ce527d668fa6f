#pragma once

#include <string>
#include <string_view>

namespace nimbra::device {

/// `text` as it stands in the name of a unit, where "-" parts the pieces: every other byte than
/// letters, digits, ":", "_" and "." is written as "\xXX".
[[nodiscard]] std::string escapedForUnitName(std::string_view text);

/// Whether a unit called `unit` runs the application `identifier`, by the names that desktop
/// environments give: "app-[LAUNCHER-]IDENTIFIER-RANDOM.scope" and
/// "app-[LAUNCHER-]IDENTIFIER[@RANDOM].service".
[[nodiscard]] bool isUnitOfApplication(std::string_view unit, std::string_view identifier);

} // namespace nimbra::device
