#pragma once

#include "platform/apps/AppProxy.h"
#include "platform/values/Identifier.h"

#include <memory>

namespace nimbra {

/// The applications on the device. Any queue.
class Applications {
public:
    virtual ~Applications() = default;

    /// The application called `identifier`, as it is now; null when there is none, and when it
    /// cannot be read, which is logged.
    [[nodiscard]] virtual std::shared_ptr<const AppProxy>
    applicationProxyForIdentifier(const BundleIdentifier& identifier) = 0;
};

} // namespace nimbra
