#pragma once

#include "device/system/TimeSource.h"
#include "platform/system/Clock.h"

#include <memory>
#include <utility>

namespace nimbra::device {

/// The date of the platform's source of time. Any thread.
class DeviceClock final : public Clock {
public:
    explicit DeviceClock(std::shared_ptr<const TimeSource> timeSource)
        : _timeSource(std::move(timeSource)) {}

    [[nodiscard]] Date now() const override { return _timeSource->now(); }

private:
    std::shared_ptr<const TimeSource> _timeSource;
};

} // namespace nimbra::device
