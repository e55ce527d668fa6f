#pragma once

#include "device/store/AccountDatabase.h"
#include "platform/accounts/AccountStore.h"
#include "platform/values/Error.h"

#include <expected>
#include <mutex>
#include <vector>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// The accounts in the device's database. Any thread.
class DeviceAccountStore final : public AccountStore {
public:
    /// A store that reads `database` and tells `log`, which outlives it, of what goes wrong.
    DeviceAccountStore(AccountDatabase database, SystemLog& log);

    [[nodiscard]] std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) override;

    /// The accounts in their order.
    [[nodiscard]] std::expected<std::vector<AccountIdentifier>, Error> accountIdentifiers();

private:
    std::mutex _mutex;
    AccountDatabase _database;
    SystemLog& _log;
};

} // namespace nimbra::device
