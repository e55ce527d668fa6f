#pragma once

#include "platform/apps/Entitlements.h"
#include "platform/values/Text.h"

namespace nimbra {

/// An application that is known to the device. Any queue; answers as of when it was asked for.
class AppProxy {
public:
    AppProxy() = default;
    AppProxy(const AppProxy&) = delete;
    AppProxy& operator=(const AppProxy&) = delete;
    virtual ~AppProxy() = default;

    /// Whether it belongs to the system and the user has removed it.
    [[nodiscard]] virtual bool isRemovedSystemApp() const = 0;
    [[nodiscard]] virtual const Entitlements& entitlements() const = 0;
    /// Its name in the user's language.
    [[nodiscard]] virtual Text localizedName() const = 0;
};

} // namespace nimbra
