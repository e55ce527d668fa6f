#pragma once

#include <string>
#include <string_view>

namespace nimbra::test {

/// Reads `format` as a visual format of the views `bar`, `label` and `box` and the metrics
/// `margin`, `low` and `wrong`, and lays out views of several sizes with it. Gives what does not
/// hold of whatever is read, in a sentence; an empty one when all does.
[[nodiscard]] std::string faultInVisualFormat(std::string_view format);

/// Whether that format is a good one.
[[nodiscard]] bool isVisualFormat(std::string_view format);

} // namespace nimbra::test
