#include "device/store/DeviceAccountStore.h"

#include "platform/system/SystemLog.h"

#include <utility>

namespace nimbra::device {

DeviceAccountStore::DeviceAccountStore(AccountDatabase database, SystemLog& log)
    : _database(std::move(database)), _log(log) {}

std::shared_ptr<Account>
DeviceAccountStore::accountWithIdentifier(const AccountIdentifier& identifier) {
    std::unique_lock lock(_mutex);
    auto record = _database.account(identifier);
    lock.unlock();
    if (!record) {
        _log.write(LogLevel::error,
                   "Can't read account " + identifier.string() + ": " + record.error().description);
        return nullptr;
    }
    return *record ? std::make_shared<DeviceAccount>(std::move(**record)) : nullptr;
}

std::expected<std::vector<AccountIdentifier>, Error> DeviceAccountStore::accountIdentifiers() {
    const std::scoped_lock lock(_mutex);
    return _database.accountIdentifiers();
}

} // namespace nimbra::device
