#pragma once

#include <csignal>
#include <initializer_list>
#include <utility>
#include <vector>

namespace nimbra::cli {

/// While it lives, the given signals end nothing: they only make a descriptor readable. One at a
/// time in a process; main thread.
class Interruption {
public:
    explicit Interruption(std::initializer_list<int> signals);
    Interruption(const Interruption&) = delete;
    Interruption& operator=(const Interruption&) = delete;
    ~Interruption();

    /// Readable from the first of the signals on; for `poll`. Not owned by the caller.
    [[nodiscard]] static int descriptor();

private:
    /// The signals, and what was done on them before.
    std::vector<std::pair<int, struct sigaction>> _earlier;
};

} // namespace nimbra::cli
