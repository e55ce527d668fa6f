#pragma once

#include "device/apps/DesktopEntry.h"
#include "platform/apps/AppProxy.h"
#include "platform/values/Identifier.h"

namespace nimbra::device {

/// An application as its desktop entry had it when it was read. Any thread.
class DeviceAppProxy final : public AppProxy {
public:
    /// One whose entry has no name goes by its identifier.
    DeviceAppProxy(const BundleIdentifier& identifier, DesktopEntry entry);

    [[nodiscard]] bool isRemovedSystemApp() const override { return _isRemoved; }
    [[nodiscard]] const Entitlements& entitlements() const override { return _entitlements; }
    [[nodiscard]] Text localizedName() const override { return _name; }

    /// The name or the path of its icon; absent where it has none.
    [[nodiscard]] const Text& icon() const { return _icon; }

private:
    Text _name;
    Text _icon;
    Entitlements _entitlements;
    bool _isRemoved;
};

} // namespace nimbra::device
