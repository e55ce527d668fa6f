#pragma once

#include <algorithm>
#include <vector>

namespace nimbra::bench {

/// The figure in the middle; of an even number the upper one of the two. Never of none.
[[nodiscard]] inline double median(std::vector<double> figures) {
    const auto middle = figures.begin() + std::ssize(figures) / 2;
    std::ranges::nth_element(figures, middle);
    return *middle;
}

} // namespace nimbra::bench
