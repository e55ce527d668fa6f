#include "device/store/DeviceAccountStore.h"

#include "device/DeviceError.h"
#include "device/files/DevicePaths.h"
#include "device/store/DeviceAccount.h"
#include "device/store/DeviceAccountOperationsHelper.h"
#include "platform/system/SystemLog.h"
#include "platform/system/WorkQueues.h"

#include <utility>

namespace nimbra::device {

DeviceAccountStore::DeviceAccountStore(AccountDatabase database, WorkQueues& queues, SystemLog& log)
    : _database(std::move(database)), _queues(queues), _log(log) {}

DeviceAccountStore::~DeviceAccountStore() = default;

std::shared_ptr<Account>
DeviceAccountStore::accountWithIdentifier(const AccountIdentifier& identifier) {
    auto found = record(identifier);
    return found ? std::make_shared<DeviceAccount>(std::move(*found), *this) : nullptr;
}

void DeviceAccountStore::saveVerifiedAccountWithCompletionHandler(
    const std::shared_ptr<Account>& account, SaveCompletion completion) {
    std::call_once(_saveQueueCreation,
                   [this] { _saveQueue = _queues.serialQueueWithLabel("account-store"); });
    _saveQueue->async(
        [this, account, completion = std::move(completion)] { completion(save(account)); });
}

void DeviceAccountStore::saveAccount(const std::shared_ptr<Account>& account, SaveOptions options) {
    saveVerifiedAccountWithCompletionHandler(account, std::move(options.completion));
}

std::shared_ptr<AccountOperationsHelper> DeviceAccountStore::operationsHelperWithDelegate(
    std::weak_ptr<AccountOperationsHelperDelegate> delegate) {
    return std::make_shared<DeviceAccountOperationsHelper>(
        *this, _queues.serialQueueWithLabel("account-operations"), std::move(delegate));
}

std::expected<std::vector<AccountIdentifier>, Error> DeviceAccountStore::accountIdentifiers() {
    const std::scoped_lock lock(_mutex);
    return _database.accountIdentifiers();
}

std::optional<AccountRecord> DeviceAccountStore::record(const AccountIdentifier& identifier) {
    std::unique_lock lock(_mutex);
    auto found = _database.account(identifier);
    lock.unlock();
    if (!found) {
        _log.write(LogLevel::error, "Can't read account " + identifier.string() + ": " +
                                        asTheDeviceSaysIt(std::move(found.error())).description);
        return std::nullopt;
    }
    return std::move(*found);
}

std::expected<void, Error> DeviceAccountStore::save(const std::shared_ptr<Account>& account) {
    // Whoever plans a failure knows of it: the log is for real ones.
    if (auto planned = _saveOutcomes.take()) {
        return std::unexpected(std::move(*planned));
    }
    auto written = write(account);
    if (!written) {
        const std::string name = account ? ' ' + account->identifier().string() : std::string();
        _log.write(LogLevel::error,
                   "Can't save account" + name + ": " + written.error().description);
    }
    return written;
}

void DeviceAccountStore::planSaveOutcomes(std::vector<std::optional<Error>> outcomes) {
    _saveOutcomes.plan(std::move(outcomes));
}

/// Where the device's directory stands on this machine concerns no page and no log of the device.
Error DeviceAccountStore::asTheDeviceSaysIt(Error error) const {
    return withPath(std::move(error), _database.path(), kAccountsDatabase);
}

std::expected<void, Error> DeviceAccountStore::write(const std::shared_ptr<Account>& account) {
    if (!account) {
        return std::unexpected(deviceError("there is no account to be saved"));
    }
    const auto own = std::dynamic_pointer_cast<DeviceAccount>(account);
    if (!own) {
        return std::unexpected(deviceError("the account is not of this store"));
    }
    const AccountChanges changes = own->changes();
    {
        const std::scoped_lock lock(_mutex);
        if (auto written = _database.writeChanges(own->identifier(), changes); !written) {
            return std::unexpected(asTheDeviceSaysIt(std::move(written.error())));
        }
    }
    own->didSave(changes);
    return {};
}

} // namespace nimbra::device
