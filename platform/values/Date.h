#pragma once

#include <chrono>

namespace nimbra {

/// A point in time.
using Date = std::chrono::system_clock::time_point;

} // namespace nimbra
