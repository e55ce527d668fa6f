#pragma once

#include "device/DeviceDescription.h"
#include "device/store/Database.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/values/Error.h"
#include "platform/values/Identifier.h"

#include <chrono>
#include <expected>
#include <filesystem>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra::device {

/// The database of what the user allows to applications: its form, and what is read and written.
/// Not thread-safe.
class ConsentDatabase {
public:
    struct Record {
        /// Absent for an application without an identifier.
        std::optional<BundleIdentifier> bundle;
        /// Absent where the user has said nothing yet.
        std::optional<bool> granted;

        friend bool operator==(const Record&, const Record&) = default;
    };

    /// Makes a new database without records at `path`; where another process has made one
    /// meanwhile, that one is opened. What happens on the way leaves a whole database or none.
    [[nodiscard]] static std::expected<ConsentDatabase, Error>
    create(const std::filesystem::path& path);

    /// Opens the database at `path`; nothing where nothing stands there, as on a device that an
    /// earlier version made. A file that is no such database, is damaged or was made by a later
    /// version is an error, and stays untouched. Reading and writing wait as long as `patience`
    /// for another program that is using the file.
    [[nodiscard]] static std::expected<std::optional<ConsentDatabase>, Error>
    open(const std::filesystem::path& path,
         std::chrono::milliseconds patience = Database::patience);

    /// The same only to look at it: nothing is written.
    [[nodiscard]] static std::expected<std::optional<ConsentDatabase>, Error>
    openForReading(const std::filesystem::path& path);

    /// The version of the database's form.
    [[nodiscard]] std::expected<std::int64_t, Error> version() { return _database->version(); }

    /// The records of all services in the order in which they came.
    [[nodiscard]] std::expected<std::vector<DeviceDescription::ConsentRecord>, Error> allRecords();

    /// The records of `service` in the order in which they came.
    [[nodiscard]] std::expected<std::vector<Record>, Error> records(const PrivacyService& service);

    /// Sets all records of `bundle` and `service`, or adds one at the end where there is none; one
    /// transaction.
    [[nodiscard]] std::expected<void, Error>
    setGranted(const PrivacyService& service, const BundleIdentifier& bundle, bool granted);

    /// Makes `records` the only ones, in their order; one transaction.
    [[nodiscard]] std::expected<void, Error>
    replaceRecords(const std::vector<DeviceDescription::ConsentRecord>& records);

private:
    explicit ConsentDatabase(std::unique_ptr<Database> database);

    std::unique_ptr<Database> _database;
};

} // namespace nimbra::device
