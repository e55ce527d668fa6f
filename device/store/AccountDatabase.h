#pragma once

#include "device/DeviceDescription.h"
#include "device/store/AccountRecord.h"
#include "device/store/Database.h"
#include "platform/values/Error.h"
#include "platform/values/Identifier.h"

#include <chrono>
#include <expected>
#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra::device {

/// The database of a device's accounts: its form, and what is read and written. Not thread-safe.
class AccountDatabase {
public:
    /// Makes a new database without accounts at `path`, where nothing stands.
    [[nodiscard]] static std::expected<AccountDatabase, Error>
    create(const std::filesystem::path& path);

    /// Opens the database at `path`, which an earlier version may have made. A file that is no
    /// such database, is damaged or was made by a later version is an error, and stays untouched.
    /// Reading and writing wait as long as `patience` for another program that is using the file.
    [[nodiscard]] static std::expected<AccountDatabase, Error>
    open(const std::filesystem::path& path,
         std::chrono::milliseconds patience = Database::patience);

    /// The same only to look at it: nothing is written.
    [[nodiscard]] static std::expected<AccountDatabase, Error>
    openForReading(const std::filesystem::path& path);

    [[nodiscard]] const std::filesystem::path& path() const { return _database->path(); }

    /// The version of the database's form.
    [[nodiscard]] std::expected<std::int64_t, Error> version() { return _database->version(); }

    /// Everything that is kept of the accounts, in their order.
    [[nodiscard]] std::expected<std::vector<DeviceDescription::AccountDescription>, Error>
    accounts();

    /// The accounts in their order.
    [[nodiscard]] std::expected<std::vector<AccountIdentifier>, Error> accountIdentifiers();

    /// What is kept of one account; nothing when there is no such account.
    [[nodiscard]] std::expected<std::optional<AccountRecord>, Error>
    account(const AccountIdentifier& identifier);

    /// Writes `changes` of one account, all or none; one transaction. An account that is not there
    /// any more is an error.
    [[nodiscard]] std::expected<void, Error> writeChanges(const AccountIdentifier& identifier,
                                                          const AccountChanges& changes);

    /// Makes `accounts` the only ones, in their order; one transaction.
    [[nodiscard]] std::expected<void, Error>
    replaceAccounts(const std::vector<DeviceDescription::AccountDescription>& accounts);

private:
    explicit AccountDatabase(std::unique_ptr<Database> database);

    [[nodiscard]] std::expected<void, Error>
    insertAccount(const DeviceDescription::AccountDescription& account, std::int64_t position);

    [[nodiscard]] std::expected<void, Error> requireAccount(const AccountIdentifier& identifier);
    [[nodiscard]] std::expected<void, Error> writeFlags(const char* statement,
                                                        const AccountIdentifier& identifier,
                                                        const std::map<Dataclass, bool>& flags);

    std::unique_ptr<Database> _database;
};

} // namespace nimbra::device
