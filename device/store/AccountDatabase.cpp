#include "device/store/AccountDatabase.h"

#include "device/DeviceError.h"
#include "device/store/Schema.h"

#include <array>
#include <cstdint>
#include <set>
#include <string>
#include <utility>

namespace nimbra::device {

namespace {

constexpr std::array migrations{
    R"(CREATE TABLE accounts (
           identifier TEXT NOT NULL PRIMARY KEY,
           position INTEGER NOT NULL,
           is_primary INTEGER NOT NULL,
           uses_stratafile INTEGER NOT NULL,
           tessary_account TEXT
       ) STRICT;
       CREATE TABLE account_dataclasses (
           account TEXT NOT NULL REFERENCES accounts (identifier) ON DELETE CASCADE,
           dataclass TEXT NOT NULL,
           enabled INTEGER NOT NULL,
           provisioned INTEGER NOT NULL,
           cellular INTEGER NOT NULL,
           PRIMARY KEY (account, dataclass)
       ) STRICT, WITHOUT ROWID;)",
};

constexpr auto selectIdentifiers = "SELECT identifier FROM accounts ORDER BY position";
// One statement sees one state, whatever another process writes meanwhile.
constexpr auto selectAccount =
    "SELECT is_primary, uses_stratafile, tessary_account, dataclass, enabled, provisioned, "
    "cellular FROM accounts LEFT JOIN account_dataclasses ON account = identifier "
    "WHERE identifier = ?";
constexpr auto selectAccounts =
    "SELECT identifier, is_primary, uses_stratafile, tessary_account, dataclass, enabled, "
    "provisioned, cellular FROM accounts "
    "LEFT JOIN account_dataclasses ON account = identifier ORDER BY position, identifier";
constexpr auto countAccount = "SELECT count(*) FROM accounts WHERE identifier = ?";
constexpr auto writeUsesStratafile = "UPDATE accounts SET uses_stratafile = ? WHERE identifier = ?";
constexpr auto writeEnabled =
    "INSERT INTO account_dataclasses (account, dataclass, enabled, provisioned, cellular) "
    "VALUES (?, ?, ?, 0, 0) "
    "ON CONFLICT (account, dataclass) DO UPDATE SET enabled = excluded.enabled";
constexpr auto writeCellular =
    "INSERT INTO account_dataclasses (account, dataclass, cellular, enabled, provisioned) "
    "VALUES (?, ?, ?, 0, 0) "
    "ON CONFLICT (account, dataclass) DO UPDATE SET cellular = excluded.cellular";
constexpr auto insertAccountRow =
    "INSERT INTO accounts (identifier, position, is_primary, uses_stratafile, tessary_account) "
    "VALUES (?, ?, ?, ?, ?)";
constexpr auto insertDataclassRow =
    "INSERT INTO account_dataclasses (account, dataclass, enabled, provisioned, cellular) "
    "VALUES (?, ?, ?, ?, ?)";

constexpr std::array readings{selectIdentifiers, selectAccount};
constexpr Schema schema{
    .kind = "an account database", .migrations = migrations, .readings = readings};

Database::Value orNull(const std::optional<std::string>& text) {
    return text ? Database::Value(*text) : Database::Value(nullptr);
}

// The columns of `selectAccount`.
enum Column : std::uint8_t {
    primaryColumn,
    stratafileColumn,
    tessaryColumn,
    dataclassColumn,
    enabledColumn,
    provisionedColumn,
    cellularColumn
};

AccountRecord accountOf(const Database::Row& row, const AccountIdentifier& identifier) {
    AccountRecord record{.identifier = identifier,
                         .isPrimary = row.integer(primaryColumn) != 0,
                         .usesStratafile = row.integer(stratafileColumn) != 0};
    if (!row.isNull(tessaryColumn)) {
        record.tessaryAccount.emplace(row.text(tessaryColumn));
    }
    return record;
}

/// Adds what the row says of one data class to the account; an account may have none.
void addDataclass(const Database::Row& row, AccountRecord& record) {
    if (row.isNull(dataclassColumn)) {
        return;
    }
    const auto addTo = [&row](std::set<Dataclass>& classes, Column flag) {
        if (row.integer(flag) != 0) {
            classes.emplace(row.text(dataclassColumn));
        }
    };
    addTo(record.enabled, enabledColumn);
    addTo(record.provisioned, provisionedColumn);
    addTo(record.cellular, cellularColumn);
}

} // namespace

AccountDatabase::AccountDatabase(std::unique_ptr<Database> database)
    : _database(std::move(database)) {}

std::expected<AccountDatabase, Error> AccountDatabase::create(const std::filesystem::path& path) {
    auto database = schema.create(path);
    if (!database) {
        return std::unexpected(database.error());
    }
    return AccountDatabase(std::move(*database));
}

std::expected<AccountDatabase, Error> AccountDatabase::open(const std::filesystem::path& path,
                                                            std::chrono::milliseconds patience) {
    auto database = schema.open(path, patience);
    if (!database) {
        return std::unexpected(database.error());
    }
    return AccountDatabase(std::move(*database));
}

std::expected<AccountDatabase, Error>
AccountDatabase::openForReading(const std::filesystem::path& path) {
    auto database = schema.openForReading(path);
    if (!database) {
        return std::unexpected(database.error());
    }
    return AccountDatabase(std::move(*database));
}

std::expected<std::vector<DeviceDescription::AccountDescription>, Error>
AccountDatabase::accounts() {
    std::vector<DeviceDescription::AccountDescription> accounts;
    const auto read = _database->query(selectAccounts, {}, [&accounts](const Database::Row& row) {
        // A row for each data class: those of one account stand together.
        if (accounts.empty() || accounts.back().identifier != row.text(0)) {
            accounts.push_back(
                {.identifier = row.text(0),
                 .primary = row.integer(1) != 0,
                 .usesStratafile = row.integer(2) != 0,
                 .tessaryAccount = row.isNull(3) ? std::nullopt : std::optional(row.text(3))});
        }
        if (row.isNull(4)) {
            return;
        }
        auto& account = accounts.back();
        int column = 5;
        for (auto* const names : {&account.enabled, &account.provisioned, &account.cellular}) {
            if (row.integer(column++) != 0) {
                names->insert(row.text(4));
            }
        }
    });
    if (!read) {
        return std::unexpected(read.error());
    }
    return accounts;
}

std::expected<std::vector<AccountIdentifier>, Error> AccountDatabase::accountIdentifiers() {
    std::vector<AccountIdentifier> identifiers;
    const auto read =
        _database->query(selectIdentifiers, {}, [&identifiers](const Database::Row& row) {
            identifiers.emplace_back(row.text(0));
        });
    if (!read) {
        return std::unexpected(read.error());
    }
    return identifiers;
}

std::expected<std::optional<AccountRecord>, Error>
AccountDatabase::account(const AccountIdentifier& identifier) {
    std::optional<AccountRecord> record;
    const auto read = _database->query(selectAccount, {identifier.string()},
                                       [&record, &identifier](const Database::Row& row) {
                                           if (!record) {
                                               record = accountOf(row, identifier);
                                           }
                                           addDataclass(row, *record);
                                       });
    if (!read) {
        return std::unexpected(read.error());
    }
    return record;
}

std::expected<void, Error> AccountDatabase::writeChanges(const AccountIdentifier& identifier,
                                                         const AccountChanges& changes) {
    return _database->transaction([this, &identifier, &changes]() -> std::expected<void, Error> {
        auto written = requireAccount(identifier);
        if (written && changes.usesStratafile) {
            written = _database->execute(
                writeUsesStratafile, {std::int64_t{*changes.usesStratafile}, identifier.string()});
        }
        if (written) {
            written = writeFlags(writeEnabled, identifier, changes.enabled);
        }
        if (written) {
            written = writeFlags(writeCellular, identifier, changes.cellular);
        }
        return written;
    });
}

std::expected<void, Error> AccountDatabase::requireAccount(const AccountIdentifier& identifier) {
    std::int64_t count = 0;
    auto counted = _database->query(countAccount, {identifier.string()},
                                    [&count](const Database::Row& row) { count = row.integer(0); });
    if (counted && count == 0) {
        return std::unexpected(
            deviceError(_database->path().string() + ": holds no such account any more"));
    }
    return counted;
}

std::expected<void, Error> AccountDatabase::writeFlags(const char* statement,
                                                       const AccountIdentifier& identifier,
                                                       const std::map<Dataclass, bool>& flags) {
    std::expected<void, Error> written;
    for (const auto& [dataclass, value] : flags) {
        if (written) {
            written = _database->execute(
                statement, {identifier.string(), dataclass.string(), std::int64_t{value}});
        }
    }
    return written;
}

std::expected<void, Error> AccountDatabase::replaceAccounts(
    const std::vector<DeviceDescription::AccountDescription>& accounts) {
    return _database->transaction([this, &accounts]() -> std::expected<void, Error> {
        if (auto emptied = _database->execute("DELETE FROM accounts", {}); !emptied) {
            return emptied;
        }
        std::int64_t position = 0;
        for (const DeviceDescription::AccountDescription& account : accounts) {
            if (auto inserted = insertAccount(account, position++); !inserted) {
                return inserted;
            }
        }
        return {};
    });
}

std::expected<void, Error>
AccountDatabase::insertAccount(const DeviceDescription::AccountDescription& account,
                               std::int64_t position) {
    auto inserted = _database->execute(
        insertAccountRow, {account.identifier, position, std::int64_t{account.primary},
                           std::int64_t{account.usesStratafile}, orNull(account.tessaryAccount)});
    std::set<std::string> dataclasses = account.enabled;
    dataclasses.insert(account.provisioned.begin(), account.provisioned.end());
    dataclasses.insert(account.cellular.begin(), account.cellular.end());
    for (const std::string& dataclass : dataclasses) {
        if (inserted) {
            inserted = _database->execute(insertDataclassRow,
                                          {account.identifier, dataclass,
                                           std::int64_t{account.enabled.contains(dataclass)},
                                           std::int64_t{account.provisioned.contains(dataclass)},
                                           std::int64_t{account.cellular.contains(dataclass)}});
        }
    }
    return inserted;
}

} // namespace nimbra::device
