#pragma once

#include <cstddef>

namespace nimbra::cli {

/// What can be shown where the output goes.
struct Terminal {
    /// Columns.
    std::size_t width = 80;
    /// Whether bold and dim text and colours are wanted and understood.
    bool isStyled = false;

    /// What standard output goes to. Styles are off where NO_COLOR is set.
    [[nodiscard]] static Terminal ofStandardOutput();
};

} // namespace nimbra::cli
