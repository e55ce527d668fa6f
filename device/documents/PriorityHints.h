#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <string>

namespace nimbra::device {

/// The containers that this process looks at, as the daemon finds them: one empty file each in
/// `run/nimbra/priority-hints/PID`, named by the container's identifier with what cannot stand in
/// a file name percent-encoded. Any thread.
class PriorityHints {
public:
    explicit PriorityHints(DevicePaths paths);

    /// Leaves the hint for `container`; one that stands already is as good.
    [[nodiscard]] std::expected<void, Error> add(const std::string& container) const;

    /// Takes back every hint of this process.
    [[nodiscard]] std::expected<void, Error> removeAll() const;

private:
    /// Where this process has its hints, on the device.
    [[nodiscard]] static std::string directory();

    DevicePaths _paths;
};

} // namespace nimbra::device
