#pragma once

#include <string_view>

namespace nimbra::cli {

/// The script that completes command lines of this program in bash.
[[nodiscard]] std::string_view bashCompletion();
/// The same for zsh.
[[nodiscard]] std::string_view zshCompletion();

} // namespace nimbra::cli
