#pragma once

#include <chrono>

namespace nimbra::bench {

/// The time since it was made.
class Stopwatch {
public:
    [[nodiscard]] double milliseconds() const {
        return std::chrono::duration<double, std::milli>(Clock::now() - _began).count();
    }

private:
    using Clock = std::chrono::steady_clock;

    Clock::time_point _began = Clock::now();
};

} // namespace nimbra::bench
