#include "device/apps/DeviceAppProxy.h"

#include <utility>

namespace nimbra::device {

DeviceAppProxy::DeviceAppProxy(const BundleIdentifier& identifier, DesktopEntry entry)
    : _name(entry.name ? Text(std::move(*entry.name)) : Text(identifier.string())),
      _icon(entry.icon ? Text(std::move(*entry.icon)) : Text()),
      _entitlements(std::move(entry.entitlements)), _isRemoved(entry.isHidden) {}

} // namespace nimbra::device
