#include "device/store/Schema.h"

#include "device/DeviceError.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace nimbra::device {

namespace {

std::int64_t currentVersion(const Schema& schema) {
    return static_cast<std::int64_t>(schema.migrations.size());
}

std::expected<void, Error> checkVersion(const Schema& schema, Database& database) {
    const auto found = database.version();
    if (!found) {
        return std::unexpected(found.error());
    }
    if (*found < 1) {
        return std::unexpected(deviceError("it has no version"));
    }
    if (*found > currentVersion(schema)) {
        return std::unexpected(deviceError("it has version " + std::to_string(*found) +
                                           ", this program knows up to " +
                                           std::to_string(currentVersion(schema))));
    }
    return {};
}

std::expected<void, Error> check(const Schema& schema, Database& database) {
    if (auto checked = checkVersion(schema, database); !checked) {
        return checked;
    }
    std::string verdict;
    auto checked = database.query("PRAGMA quick_check(1)", {},
                                  [&verdict](const Database::Row& row) { verdict = row.text(0); });
    if (checked && verdict != "ok") {
        return std::unexpected(deviceError("it is damaged: " + verdict));
    }
    for (const char* const reading : schema.readings) {
        if (checked) {
            checked = database.execute(reading, {});
        }
    }
    return checked;
}

std::expected<void, Error> migrate(const Schema& schema, Database& database) {
    const auto before = database.version();
    if (!before) {
        return std::unexpected(before.error());
    }
    if (*before == currentVersion(schema)) {
        return {};
    }
    return database.transaction([&schema, &database]() -> std::expected<void, Error> {
        // Another program may have been faster since.
        const auto found = database.version();
        if (!found) {
            return std::unexpected(found.error());
        }
        for (const char* const script :
             schema.migrations.subspan(static_cast<std::size_t>(*found))) {
            if (auto migrated = database.executeScript(script); !migrated) {
                return migrated;
            }
        }
        return database.executeScript("PRAGMA user_version = " +
                                      std::to_string(currentVersion(schema)));
    });
}

/// `error` of the database at `path`, told as the reason why it is none of the schema's kind. Of a
/// file that cannot be read, or not now, nobody knows that.
Error notOfKind(const Schema& schema, const std::filesystem::path& path, const Error& error) {
    if (error.domain == "POSIX" || !Database::tellsOfContent(error)) {
        return error;
    }
    // Descriptions have it in this form.
    const std::string start = oneLine(path.string()) + ": ";
    const bool namesPath = error.description.starts_with(start);
    return deviceError(start + "not " + std::string(schema.kind) + ": " +
                       error.description.substr(namesPath ? start.size() : 0));
}

} // namespace

std::expected<std::unique_ptr<Database>, Error>
Schema::create(const std::filesystem::path& path) const {
    auto database = Database::open(path, Database::Access::create);
    if (!database) {
        return database;
    }
    // In this order: what stands in a log of changes would be lost where the disk is too full to
    // move it into the file, and nobody would be told.
    if (auto migrated = migrate(*this, **database); !migrated) {
        return std::unexpected(migrated.error());
    }
    if (auto set = (*database)->executeScript("PRAGMA journal_mode = WAL"); !set) {
        return std::unexpected(set.error());
    }
    return database;
}

std::expected<std::unique_ptr<Database>, Error>
Schema::open(const std::filesystem::path& path, std::chrono::milliseconds patience) const {
    auto database = Database::open(path, Database::Access::existing, patience);
    if (!database) {
        return std::unexpected(notOfKind(*this, path, database.error()));
    }
    if (const auto checked = check(*this, **database); !checked) {
        (*database)->leaveAsFound();
        return std::unexpected(notOfKind(*this, path, checked.error()));
    }
    if (auto migrated = migrate(*this, **database); !migrated) {
        return std::unexpected(migrated.error());
    }
    return database;
}

std::expected<std::unique_ptr<Database>, Error>
Schema::openForReading(const std::filesystem::path& path) const {
    auto database = Database::open(path, Database::Access::reading);
    if (!database) {
        return std::unexpected(notOfKind(*this, path, database.error()));
    }
    if (const auto checked = check(*this, **database); !checked) {
        return std::unexpected(notOfKind(*this, path, checked.error()));
    }
    return database;
}

} // namespace nimbra::device
