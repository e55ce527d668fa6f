#pragma once

#include "platform/system/Bundle.h"

#include <memory>

namespace nimbra {

/// The bundles that this process knows. Any queue.
class Bundles {
public:
    virtual ~Bundles() = default;

    /// The bundle called `identifier`; null when none of that name is known.
    [[nodiscard]] virtual std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const = 0;
};

} // namespace nimbra
