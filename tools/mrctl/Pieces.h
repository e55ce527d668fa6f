#pragma once

#include "tools/mrctl/Characters.h"

#include <string_view>
#include <vector>

namespace nimbra::mrctl {

using Pieces = std::vector<std::string_view>;

/// The parts of `run` of letters and digits, without the signs between them.
[[nodiscard]] inline Pieces piecesOf(std::string_view run) {
    Pieces pieces;
    for (std::size_t begin = 0; begin < run.size();) {
        const std::size_t end = endOfRun(run, begin, isAlphanumeric);
        if (end > begin) {
            pieces.push_back(run.substr(begin, end - begin));
        }
        begin = end + 1;
    }
    return pieces;
}

} // namespace nimbra::mrctl
