#pragma once

#include "platform/values/Identifier.h"

namespace nimbra {

/// What whoever manages the device allows its user. Any queue; answers what holds now, and allows
/// nothing while that cannot be read: it may be forbidden.
class RestrictionsProfile {
public:
    virtual ~RestrictionsProfile() = default;

    /// Whether the user may change which applications use cellular data.
    [[nodiscard]] virtual bool isAppCellularDataModificationAllowed() const = 0;

    /// Whether the application `bundle` may use the cloud at all.
    [[nodiscard]] virtual bool isCloudSyncAllowed(const BundleIdentifier& bundle) const = 0;
};

} // namespace nimbra
