#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::cli {

/// How many columns of a terminal `text` takes: two for the wide characters of East Asia, none for
/// accents that stand over another character.
[[nodiscard]] std::size_t displayWidth(std::string_view text);

/// `text` as a terminal may get it: control characters, which could move its cursor, and what turns
/// the direction of writing round are blanks.
[[nodiscard]] std::string printable(std::string_view text);

/// `text` in lines of at most `width` columns, broken where its language allows it and at its own
/// line ends; what cannot be broken stands alone on a longer line.
[[nodiscard]] std::vector<std::string> wrapped(std::string_view text, std::size_t width);

} // namespace nimbra::cli
