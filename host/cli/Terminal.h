#pragma once

#include <cstddef>

namespace nimbra::cli {

/// What can be shown where the output goes.
struct Terminal {
    /// In columns; a wide window is not filled.
    std::size_t width = 80;
    /// Whether bold and dim text and colours are wanted and understood.
    bool isStyled = false;

    /// What standard output goes to. Styles are off where that is no terminal or a dumb one, and
    /// where NO_COLOR is set.
    [[nodiscard]] static Terminal ofStandardOutput();
};

} // namespace nimbra::cli
