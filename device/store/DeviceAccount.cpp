#include "device/store/DeviceAccount.h"

#include <utility>

namespace nimbra::device {

DeviceAccount::DeviceAccount(Record record) : _record(std::move(record)) {}

const AccountIdentifier& DeviceAccount::identifier() const {
    return _record.identifier;
}

bool DeviceAccount::isEnabledForDataclass(const Dataclass& dataclass) const {
    return _record.enabled.contains(dataclass);
}

void DeviceAccount::setEnabledForDataclass(bool enabled, const Dataclass& dataclass) {
    if (enabled) {
        _record.enabled.insert(dataclass);
    } else {
        _record.enabled.erase(dataclass);
    }
}

bool DeviceAccount::vt_isUsingStratafile() const {
    return _record.usesStratafile;
}

} // namespace nimbra::device
