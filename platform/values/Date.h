#pragma once

#include <chrono>

namespace nimbra {

/// A point in time, to the microsecond: in this width every year that can be written has its dates.
using Date = std::chrono::sys_time<std::chrono::microseconds>;

} // namespace nimbra
