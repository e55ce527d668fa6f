#pragma once

#include <deque>
#include <iterator>
#include <mutex>
#include <optional>
#include <utility>
#include <vector>

namespace nimbra::device {

/// What calls of one operation are to come to, for whoever wants to see a failure. Any thread.
template <class Failure>
class PlannedOutcomes {
public:
    /// Lets the next calls have these outcomes, one a call and in this order; an empty one is a
    /// call that is really made, as are all behind the last. What was planned before is dropped.
    void plan(std::vector<std::optional<Failure>> outcomes) {
        const std::scoped_lock lock(_mutex);
        _outcomes.assign(std::make_move_iterator(outcomes.begin()),
                         std::make_move_iterator(outcomes.end()));
    }

    /// How this call fails; nothing for one that is really made.
    [[nodiscard]] std::optional<Failure> take() {
        const std::scoped_lock lock(_mutex);
        if (_outcomes.empty()) {
            return std::nullopt;
        }
        std::optional<Failure> outcome = std::move(_outcomes.front());
        _outcomes.pop_front();
        return outcome;
    }

private:
    std::mutex _mutex;
    std::deque<std::optional<Failure>> _outcomes;
};

} // namespace nimbra::device
