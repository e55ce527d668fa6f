#pragma once

#include "device/apps/ApplicationProcesses.h"

#include <chrono>
#include <memory>
#include <optional>

namespace nimbra::device {

/// The scopes and services in which the user's systemd runs applications that a desktop
/// environment has started. Where there is no session bus, or no manager on it, no application
/// runs this way; a bus that could not be had is not tried again for a minute. The unit that holds
/// this process itself is left alone.
class SystemdUnits final : public ApplicationProcesses {
public:
    [[nodiscard]] std::unique_ptr<EndingApplication>
    askToEnd(const BundleIdentifier& application) override;

private:
    /// When the bus could not be had last. One that accepts and says nothing costs a long wait each
    /// time, in which no other application ends.
    std::optional<std::chrono::steady_clock::time_point> _failed;
};

} // namespace nimbra::device
