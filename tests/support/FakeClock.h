#pragma once

#include "platform/system/Clock.h"

namespace nimbra::test {

/// A clock that a test sets.
struct FakeClock final : Clock {
    Date date;

    [[nodiscard]] Date now() const override { return date; }
};

} // namespace nimbra::test
