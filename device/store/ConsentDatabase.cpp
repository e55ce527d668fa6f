#include "device/store/ConsentDatabase.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"
#include "device/store/Schema.h"

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

constexpr std::array migrations{
    R"(CREATE TABLE consent (
           position INTEGER PRIMARY KEY,
           service TEXT NOT NULL,
           bundle TEXT,
           granted INTEGER
       ) STRICT;
       CREATE INDEX consent_of_bundle ON consent (bundle, service);)",
};

constexpr auto selectRecords =
    "SELECT bundle, granted FROM consent WHERE service = ? ORDER BY position";
constexpr auto selectAllRecords = "SELECT bundle, granted, service FROM consent ORDER BY position";
constexpr auto updateRecords = "UPDATE consent SET granted = ?3 WHERE service = ?1 AND bundle = ?2";
constexpr auto insertMissingRecord =
    "INSERT INTO consent (service, bundle, granted) SELECT ?1, ?2, ?3 "
    "WHERE NOT EXISTS (SELECT 1 FROM consent WHERE service = ?1 AND bundle = ?2)";
constexpr auto insertRecord = "INSERT INTO consent (service, bundle, granted) VALUES (?, ?, ?)";

constexpr std::array readings{selectRecords};
constexpr Schema schema{
    .kind = "a consent database", .migrations = migrations, .readings = readings};

bool stands(const std::filesystem::path& path) {
    std::error_code failure;
    return std::filesystem::status(path, failure).type() != std::filesystem::file_type::not_found;
}

/// The record in a row that begins with its bundle and what was granted.
ConsentDatabase::Record recordIn(const Database::Row& row) {
    ConsentDatabase::Record record;
    if (!row.isNull(0)) {
        record.bundle.emplace(row.text(0));
    }
    if (!row.isNull(1)) {
        record.granted = row.integer(1) != 0;
    }
    return record;
}

/// A directory beside `target` in which something is built; goes with everything in it.
class Workshop {
public:
    explicit Workshop(const std::filesystem::path& target)
        : _path((target.parent_path() / ("." + target.filename().string() + ".XXXXXX")).string()),
          _exists(::mkdtemp(_path.data()) != nullptr) {}
    Workshop(const Workshop&) = delete;
    Workshop& operator=(const Workshop&) = delete;
    ~Workshop() {
        if (_exists) {
            std::error_code ignored; // nobody is left to be told
            std::filesystem::remove_all(_path, ignored);
        }
    }

    [[nodiscard]] bool exists() const { return _exists; }
    [[nodiscard]] std::filesystem::path path() const { return _path; }

private:
    std::string _path;
    bool _exists;
};

/// Makes a database out of sight, since a half-made one would pass for a damaged one, and puts it
/// at `path` unless another process was faster.
std::expected<void, Error> make(const std::filesystem::path& path) {
    // Changes that a database left behind would become those of the new one.
    std::filesystem::path changes = path;
    changes += "-wal";
    if (std::error_code failure; std::filesystem::exists(changes, failure) &&
                                 !std::filesystem::exists(path, failure) && !failure) {
        return std::unexpected(
            deviceError(changes.string() + ": stands here without its database"));
    }
    const Workshop workshop(path);
    if (!workshop.exists()) {
        return std::unexpected(fileError(path, "cannot be made", errno));
    }
    const std::filesystem::path made = workshop.path() / path.filename();
    if (const auto database = schema.create(made); !database) {
        return std::unexpected(withPath(database.error(), made, path.string()));
    }
    std::error_code failure;
    std::filesystem::create_hard_link(made, path, failure);
    if (failure && failure != std::errc::file_exists) {
        return std::unexpected(fileError(path, "cannot be made", failure.value()));
    }
    return synchronizeDirectory(path.parent_path());
}

} // namespace

ConsentDatabase::ConsentDatabase(std::unique_ptr<Database> database)
    : _database(std::move(database)) {}

std::expected<ConsentDatabase, Error> ConsentDatabase::create(const std::filesystem::path& path) {
    if (const auto made = make(path); !made) {
        return std::unexpected(made.error());
    }
    auto database = schema.open(path, Database::patience);
    if (!database) {
        return std::unexpected(database.error());
    }
    return ConsentDatabase(std::move(*database));
}

std::expected<std::optional<ConsentDatabase>, Error>
ConsentDatabase::open(const std::filesystem::path& path, std::chrono::milliseconds patience) {
    if (!stands(path)) {
        return std::nullopt;
    }
    auto database = schema.open(path, patience);
    if (!database) {
        return std::unexpected(database.error());
    }
    return ConsentDatabase(std::move(*database));
}

std::expected<std::optional<ConsentDatabase>, Error>
ConsentDatabase::openForReading(const std::filesystem::path& path) {
    if (!stands(path)) {
        return std::nullopt;
    }
    auto database = schema.openForReading(path);
    if (!database) {
        return std::unexpected(database.error());
    }
    return ConsentDatabase(std::move(*database));
}

std::expected<std::vector<DeviceDescription::ConsentRecord>, Error> ConsentDatabase::allRecords() {
    std::vector<DeviceDescription::ConsentRecord> records;
    const auto read = _database->query(selectAllRecords, {}, [&records](const Database::Row& row) {
        const auto [bundle, granted] = recordIn(row);
        records.push_back({.service = row.text(2),
                           .bundle = bundle ? std::optional(bundle->string()) : std::nullopt,
                           .granted = granted});
    });
    if (!read) {
        return std::unexpected(read.error());
    }
    return records;
}

std::expected<std::vector<ConsentDatabase::Record>, Error>
ConsentDatabase::records(const PrivacyService& service) {
    std::vector<Record> records;
    const auto read =
        _database->query(selectRecords, {service.string()}, [&records](const Database::Row& row) {
            records.push_back(recordIn(row));
        });
    if (!read) {
        return std::unexpected(read.error());
    }
    return records;
}

std::expected<void, Error> ConsentDatabase::setGranted(const PrivacyService& service,
                                                       const BundleIdentifier& bundle,
                                                       bool granted) {
    const Database::Values values{service.string(), bundle.string(), std::int64_t{granted}};
    return _database->transaction([this, &values] {
        auto written = _database->execute(updateRecords, values);
        return written ? _database->execute(insertMissingRecord, values) : written;
    });
}

std::expected<void, Error>
ConsentDatabase::replaceRecords(const std::vector<DeviceDescription::ConsentRecord>& records) {
    return _database->transaction([this, &records] {
        auto written = _database->execute("DELETE FROM consent", {});
        for (const DeviceDescription::ConsentRecord& record : records) {
            if (!written) {
                break;
            }
            using Value = Database::Value;
            written = _database->execute(
                insertRecord,
                {record.service, record.bundle ? Value(*record.bundle) : Value(nullptr),
                 record.granted ? Value(std::int64_t{*record.granted}) : Value(nullptr)});
        }
        return written;
    });
}

} // namespace nimbra::device
