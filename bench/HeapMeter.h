#pragma once

#include <cstddef>

namespace nimbra::bench {

/// Measures what C++ code takes from the heap, on all threads, from its making on.
class HeapMeter {
public:
    HeapMeter();

    /// The most that was taken at one moment, in bytes beyond what was taken at the beginning.
    [[nodiscard]] std::size_t peak() const;

private:
    std::size_t _atStart;
};

} // namespace nimbra::bench
