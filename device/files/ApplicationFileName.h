#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace nimbra::device {

/// The name of the file that the device keeps of the application `identifier`, ending in `suffix`
/// (".desktop"): the identifier itself, but for what no file name can hold, which is written as
/// "%XX". Never a path.
[[nodiscard]] std::string applicationFileName(std::string_view identifier, std::string_view suffix);

/// The application whose file is called `name`; nothing where no application's file has that name
/// and `suffix`.
[[nodiscard]] std::optional<std::string> applicationOfFileName(std::string_view name,
                                                               std::string_view suffix);

} // namespace nimbra::device
