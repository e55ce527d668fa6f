#pragma once

#include <string>

namespace nimbra::mrctl {

/// Where the device stands whose texts are marked.
inline const std::string kMarkedRoot = "/srv/phone";

/// `text` with "<kind>" in the place of every piece that looks like a secret, of the first's kind
/// where some overlap.
[[nodiscard]] std::string marked(const std::string& text);

} // namespace nimbra::mrctl
