#pragma once

#include <compare>
#include <cstddef>
#include <ostream>

namespace nimbra {

/// Where a row stands in a table: in which of its groups, and where in that, both counted from 0.
struct IndexPath {
    std::size_t section = 0;
    std::size_t row = 0;

    friend auto operator<=>(const IndexPath&, const IndexPath&) = default;
};

inline std::ostream& operator<<(std::ostream& out, const IndexPath& path) {
    return out << path.section << '.' << path.row;
}

} // namespace nimbra
