#pragma once

#include "platform/values/Date.h"
#include "platform/values/Text.h"

namespace nimbra {

/// Writes dates in one way, by the locale and in the time zone of the device. Any queue.
class DateFormatter {
public:
    DateFormatter() = default;
    DateFormatter(const DateFormatter&) = delete;
    DateFormatter& operator=(const DateFormatter&) = delete;
    virtual ~DateFormatter() = default;

    /// Absent where the formatter was made for a malformed pattern.
    [[nodiscard]] virtual Text stringFromDate(Date date) const = 0;
};

} // namespace nimbra
