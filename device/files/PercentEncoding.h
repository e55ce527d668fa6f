#pragma once

#include <string>
#include <string_view>

namespace nimbra::device {

/// `text` with every byte but letters, digits, "-", "_", those in `kept` and dots behind the first
/// character written as "%XX": without `kept`, the name of one file, whatever the text was.
[[nodiscard]] std::string percentEncoded(std::string_view text, std::string_view kept = {});

} // namespace nimbra::device
