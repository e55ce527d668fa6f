#pragma once

#include "platform/values/Date.h"

#include <chrono>
#include <cstdint>

namespace nimbra {

/// How often the sentence of the last sync is refreshed.
inline constexpr std::chrono::nanoseconds refreshInterval = std::chrono::seconds(60);

/// How many whole seconds lie between `date` and `now`; none for a date in the future.
[[nodiscard]] constexpr std::uint64_t secondsSince(Date date, Date now) {
    if (date >= now) {
        return 0;
    }
    // Unsigned: dates can lie further apart than a signed count of ticks reaches.
    const auto ticks = static_cast<std::uint64_t>(now.time_since_epoch().count()) -
                       static_cast<std::uint64_t>(date.time_since_epoch().count());
    constexpr auto ticksPerSecond = static_cast<std::uint64_t>(Date::duration::period::den);
    return ticks / ticksPerSecond;
}

/// When the sentence is refreshed for the first time after a sync of this age in seconds: after as
/// many *seconds* as the age has minutes beside its whole hours, or after a minute where it has
/// none. Minutes stand for seconds here on purpose; this is not the rest of the minute.
[[nodiscard]] constexpr std::chrono::nanoseconds firstDelay(std::uint64_t elapsed) {
    const std::uint64_t minutes = elapsed / 60 % 60;
    return minutes != 0 ? std::chrono::seconds(minutes) : refreshInterval;
}

} // namespace nimbra
