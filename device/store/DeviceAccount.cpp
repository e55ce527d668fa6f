#include "device/store/DeviceAccount.h"

#include "device/store/DeviceAccountStore.h"

#include <utility>

namespace nimbra::device {

namespace {

bool flag(const std::set<Dataclass>& stored, const std::map<Dataclass, bool>& changes,
          const Dataclass& dataclass) {
    const auto change = changes.find(dataclass);
    return change != changes.end() ? change->second : stored.contains(dataclass);
}

/// Makes of the changes in `saved` a part of `stored`, and of `changes` what differs from them.
void takeOver(const std::map<Dataclass, bool>& saved, std::set<Dataclass>& stored,
              std::map<Dataclass, bool>& changes) {
    for (const auto& [dataclass, value] : saved) {
        if (value) {
            stored.insert(dataclass);
        } else {
            stored.erase(dataclass);
        }
        if (const auto change = changes.find(dataclass);
            change != changes.end() && change->second == value) {
            changes.erase(change);
        }
    }
}

} // namespace

DeviceAccount::DeviceAccount(AccountRecord record, DeviceAccountStore& store)
    : _identifier(record.identifier), _store(store), _record(std::move(record)) {}

const AccountIdentifier& DeviceAccount::identifier() const {
    return _identifier;
}

bool DeviceAccount::vt_isPrimaryAccount() const {
    const std::scoped_lock lock(_mutex);
    return _record.isPrimary;
}

bool DeviceAccount::isProvisionedForDataclass(const Dataclass& dataclass) const {
    const std::scoped_lock lock(_mutex);
    return _record.provisioned.contains(dataclass);
}

std::shared_ptr<Account> DeviceAccount::vt_tessaryAccount() const {
    std::unique_lock lock(_mutex);
    const std::optional<AccountIdentifier> tessaryAccount = _record.tessaryAccount;
    lock.unlock();
    if (!tessaryAccount) {
        return nullptr;
    }
    auto stored = _store.record(*tessaryAccount);
    return std::make_shared<DeviceAccount>(
        stored ? std::move(*stored) : AccountRecord{.identifier = *tessaryAccount}, _store);
}

bool DeviceAccount::isEnabledForDataclass(const Dataclass& dataclass) const {
    const std::scoped_lock lock(_mutex);
    return flag(_record.enabled, _changes.enabled, dataclass);
}

void DeviceAccount::setEnabledForDataclass(bool enabled, const Dataclass& dataclass) {
    const std::scoped_lock lock(_mutex);
    _changes.enabled.insert_or_assign(dataclass, enabled);
}

bool DeviceAccount::vt_isUsingStratafile() const {
    const std::scoped_lock lock(_mutex);
    return _changes.usesStratafile.value_or(_record.usesStratafile);
}

void DeviceAccount::vt_setUsesStratafile(bool usesStratafile) {
    const std::scoped_lock lock(_mutex);
    _changes.usesStratafile = usesStratafile;
}

bool DeviceAccount::vt_useCellularForDataclass(const Dataclass& dataclass) const {
    const std::scoped_lock lock(_mutex);
    return flag(_record.cellular, _changes.cellular, dataclass);
}

void DeviceAccount::vt_setUseCellularForDataclass(bool useCellular, const Dataclass& dataclass) {
    const std::scoped_lock lock(_mutex);
    _changes.cellular.insert_or_assign(dataclass, useCellular);
}

void DeviceAccount::reload() {
    auto stored = _store.record(_identifier);
    const std::scoped_lock lock(_mutex);
    _changes = {};
    // Where nothing can be read, what was read last stands.
    if (stored) {
        _record = std::move(*stored);
    }
}

AccountChanges DeviceAccount::changes() const {
    const std::scoped_lock lock(_mutex);
    return _changes;
}

void DeviceAccount::didSave(const AccountChanges& saved) {
    const std::scoped_lock lock(_mutex);
    if (saved.usesStratafile) {
        _record.usesStratafile = *saved.usesStratafile;
        if (_changes.usesStratafile == saved.usesStratafile) {
            _changes.usesStratafile.reset();
        }
    }
    takeOver(saved.enabled, _record.enabled, _changes.enabled);
    takeOver(saved.cellular, _record.cellular, _changes.cellular);
}

} // namespace nimbra::device
