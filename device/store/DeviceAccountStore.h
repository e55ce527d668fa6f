#pragma once

#include "device/store/AccountDatabase.h"
#include "device/system/PlannedOutcomes.h"
#include "platform/accounts/AccountStore.h"
#include "platform/values/Error.h"

#include <expected>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

namespace nimbra {
class SystemLog;
class WorkQueue;
class WorkQueues;
} // namespace nimbra

namespace nimbra::device {

/// The accounts in the device's database. Any thread.
class DeviceAccountStore final : public AccountStore {
public:
    /// A store that keeps its accounts in `database`, saves on a queue of its own of `queues` and
    /// tells `log` of what goes wrong; neither is owned, both outlive it. The queues run dry
    /// before the store goes.
    DeviceAccountStore(AccountDatabase database, WorkQueues& queues, SystemLog& log);
    ~DeviceAccountStore() override;

    [[nodiscard]] std::shared_ptr<Account>
    accountWithIdentifier(const AccountIdentifier& identifier) override;
    void saveVerifiedAccountWithCompletionHandler(const std::shared_ptr<Account>& account,
                                                  SaveCompletion completion) override;
    /// A device has no service of its own to ask: an account counts as verified either way.
    void saveAccount(const std::shared_ptr<Account>& account, SaveOptions options) override;
    [[nodiscard]] std::shared_ptr<AccountOperationsHelper>
    operationsHelperWithDelegate(std::weak_ptr<AccountOperationsHelperDelegate> delegate) override;

    /// The accounts in their order.
    [[nodiscard]] std::expected<std::vector<AccountIdentifier>, Error> accountIdentifiers();

    /// What the database holds of one account; nothing when there is no such account or it cannot
    /// be read, which is logged.
    [[nodiscard]] std::optional<AccountRecord> record(const AccountIdentifier& identifier);

    /// Writes the changes of `account` in one transaction; null, or one of another store, is an
    /// error. Waits for the disk, and for another program that is writing. An error, which calls
    /// the database by its path on the device, has been logged, unless it was planned.
    [[nodiscard]] std::expected<void, Error> save(const std::shared_ptr<Account>& account);

    /// The outcomes of the next saves, used up one a save, in their order: an error is how that
    /// save fails, without anything being written. For whoever tries how a page bears failures.
    void planSaveOutcomes(std::vector<std::optional<Error>> outcomes);

private:
    [[nodiscard]] Error asTheDeviceSaysIt(Error error) const;
    [[nodiscard]] std::expected<void, Error> write(const std::shared_ptr<Account>& account);

    std::mutex _mutex;
    AccountDatabase _database;
    WorkQueues& _queues;
    SystemLog& _log;
    PlannedOutcomes<Error> _saveOutcomes;
    std::once_flag _saveQueueCreation;
    std::shared_ptr<WorkQueue> _saveQueue;
};

} // namespace nimbra::device
