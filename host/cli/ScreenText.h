#pragma once

#include "host/cli/Terminal.h"

#include <string>

namespace nimbra::host {
struct ScreenDescription;
struct ShownAlert;
} // namespace nimbra::host

namespace nimbra::cli {

/// What can be seen of a screen: its title, its texts from top to bottom and its buttons. What is
/// bold stands between asterisks where the terminal has no styles.
[[nodiscard]] std::string screenText(const host::ScreenDescription& screen,
                                     const Terminal& terminal);

/// What an alert says.
[[nodiscard]] std::string alertText(const host::ShownAlert& alert, const Terminal& terminal);

} // namespace nimbra::cli
