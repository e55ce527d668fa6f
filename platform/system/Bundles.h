#pragma once

#include "platform/system/Bundle.h"

#include <memory>
#include <typeinfo>

namespace nimbra {

/// The bundles that this process knows. Any queue.
class Bundles {
public:
    virtual ~Bundles() = default;

    /// The bundle called `identifier`; null when none of that name is known.
    [[nodiscard]] virtual std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const = 0;

    /// The bundle in the folder that the device calls `path`, loaded or not; null where no folder
    /// is. One that is loaded stays found when its folder goes.
    [[nodiscard]] virtual std::shared_ptr<Bundle> bundleWithPath(const Text& path) = 0;

    /// The bundle whose shared object holds `classType`; null for a class of no known bundle.
    [[nodiscard]] virtual std::shared_ptr<Bundle>
    bundleForClass(const std::type_info& classType) const = 0;
};

} // namespace nimbra
