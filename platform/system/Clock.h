#pragma once

#include "platform/values/Date.h"

namespace nimbra {

/// What time it is. Any queue.
class Clock {
public:
    virtual ~Clock() = default;

    [[nodiscard]] virtual Date now() const = 0;
};

} // namespace nimbra
