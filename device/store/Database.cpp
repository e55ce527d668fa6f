#include "device/store/Database.h"

#include "device/DeviceError.h"
#include "device/files/PercentEncoding.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <cerrno>
#include <fcntl.h>
#include <map>
#include <sqlite3.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

constexpr const char* libraryDomain = "SQLite";

/// What the system has refused.
const char* inputOutputError(int extendedCode) {
    switch (extendedCode) {
    case SQLITE_IOERR_READ:
    case SQLITE_IOERR_SHORT_READ:
    case SQLITE_IOERR_FSTAT:
        return "the disk cannot be read";
    case SQLITE_IOERR_WRITE:
    case SQLITE_IOERR_FSYNC:
    case SQLITE_IOERR_DIR_FSYNC:
    case SQLITE_IOERR_TRUNCATE:
        return "the disk cannot be written";
    case SQLITE_IOERR_SHMOPEN:
    case SQLITE_IOERR_SHMSIZE:
        // The library does not tell one from the other here.
        return "the disk is full or cannot be written";
    default:
        return "the disk cannot be read or written";
    }
}

/// What went wrong, in words for whoever uses the device rather than the library.
std::string inWords(const SQLite::Exception& exception) {
    switch (exception.getErrorCode()) {
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
        return "another program is using it";
    case SQLITE_READONLY:
        return "it can only be read";
    case SQLITE_FULL:
        return "the disk is full";
    case SQLITE_IOERR:
        return inputOutputError(exception.getExtendedErrorCode());
    default:
        return exception.what();
    }
}

Error databaseError(const std::filesystem::path& path, const SQLite::Exception& exception) {
    return {.domain = libraryDomain,
            .code = exception.getErrorCode(),
            .description = oneLine(path.string() + ": " + inWords(exception))};
}

std::filesystem::path withSuffix(std::filesystem::path path, const char* suffix) {
    path += suffix;
    return path;
}

/// Whether changes stand beside the database that have not been moved into it.
bool hasPendingChanges(const std::filesystem::path& path) {
    std::error_code absent;
    const auto size = std::filesystem::file_size(withSuffix(path, "-wal"), absent);
    return !absent && size > 0;
}

/// Whether all that counts stands in the file itself: no changes that are still to be moved into
/// it, and none in it that are still to be undone.
bool isComplete(const std::filesystem::path& path) {
    std::error_code absent;
    const auto undoing = std::filesystem::file_size(withSuffix(path, "-journal"), absent);
    return !hasPendingChanges(path) && (absent || undoing == 0);
}

/// Whether an error with this code may be no more than that files beside the database cannot be
/// made, for want of permission or of room.
bool isForWantOfFilesBeside(int code) {
    return code == SQLITE_CANTOPEN || code == SQLITE_READONLY || code == SQLITE_IOERR ||
           code == SQLITE_FULL;
}

/// Whether the file at `path` can be read, and all that stands there and beside it for the database
/// are plain files, in the place of which a pipe, for example, would be waited for. An error of the
/// domain POSIX says why it cannot be read.
std::expected<void, Error> checkFiles(const std::filesystem::path& path) {
    std::error_code failure;
    // The library would make others, or do without them.
    for (const char* const suffix : {"-wal", "-shm", "-journal"}) {
        const auto beside = withSuffix(path, suffix);
        const auto status = std::filesystem::symlink_status(beside, failure);
        if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status)) {
            return std::unexpected(deviceError(beside.string() + ": is not a plain file"));
        }
    }
    failure.clear();
    const auto status = std::filesystem::status(path, failure);
    if (std::filesystem::is_regular_file(status)) {
        // The library would only say that it cannot open it. To open it here as well and close it
        // again would give up the locks that this process has on it.
        if (::faccessat(AT_FDCWD, path.c_str(), R_OK, AT_EACCESS) != 0) {
            return std::unexpected(fileError(path, "cannot be read", errno));
        }
        return {};
    }
    if (!failure && std::filesystem::exists(status) && !std::filesystem::is_directory(status)) {
        return std::unexpected(deviceError(path.string() + ": is not a plain file"));
    }
    return std::unexpected(fileError(path, "cannot be read", failure ? failure.value() : EISDIR));
}

/// Opens a database in a directory in which nothing can be made, as it stands. Locks and
/// pending changes need files beside it.
SQLite::Database openAsItStands(const std::filesystem::path& path) {
    return {"file:" + percentEncoded(path.string(), "/") + "?immutable=1",
            SQLite::OPEN_READONLY | SQLite::OPEN_URI};
}

SQLite::Database openExisting(const std::filesystem::path& path, int busyTimeout) {
    try {
        SQLite::Database database(path.string(), SQLite::OPEN_READWRITE, busyTimeout);
        // Opening reads nothing yet; this does.
        static_cast<void>(database.execAndGet("PRAGMA schema_version"));
        return database;
    } catch (const SQLite::Exception& exception) {
        if (!isForWantOfFilesBeside(exception.getErrorCode()) || !isComplete(path)) {
            throw;
        }
        return openAsItStands(path);
    }
}

/// Opens a database only to look at it. Where no changes stand beside it, no file is made there for
/// them; where another program is at work or has left some, they are read with it.
SQLite::Database openForReading(const std::filesystem::path& path, int busyTimeout) {
    return hasPendingChanges(path)
               ? SQLite::Database(path.string(), SQLite::OPEN_READONLY, busyTimeout)
               : openAsItStands(path);
}

SQLite::Database openWith(Database::Access access, const std::filesystem::path& path,
                          int busyTimeout) {
    switch (access) {
    case Database::Access::create:
        return {path.string(), SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE, busyTimeout};
    case Database::Access::reading:
        return openForReading(path, busyTimeout);
    case Database::Access::existing:
        break;
    }
    return openExisting(path, busyTimeout);
}

/// Brings a kept statement back to its beginning for whoever uses it next.
class StatementUse {
public:
    explicit StatementUse(SQLite::Statement& statement) : _statement(statement) {}
    StatementUse(const StatementUse&) = delete;
    StatementUse& operator=(const StatementUse&) = delete;
    ~StatementUse() {
        // It repeats the error of the run, which has been reported.
        static_cast<void>(_statement.tryReset());
    }

private:
    SQLite::Statement& _statement;
};

} // namespace

struct Database::Connection {
    std::filesystem::path path;
    bool foundPendingChanges;
    SQLite::Database database;
    std::map<std::string, SQLite::Statement> statements;

    SQLite::Statement& statement(const std::string& sql) {
        const auto kept = statements.find(sql);
        return kept != statements.end()
                   ? kept->second
                   : statements.emplace(sql, SQLite::Statement(database, sql)).first->second;
    }

    /// Runs `work`, which may throw what the library throws.
    template <class Work>
    [[nodiscard]] std::expected<void, Error> guarded(Work work) const {
        try {
            work();
            return {};
        } catch (const SQLite::Exception& exception) {
            return std::unexpected(databaseError(path, exception));
        }
    }
};

bool Database::Row::isNull(int column) const {
    return _statement.isColumnNull(column);
}

std::int64_t Database::Row::integer(int column) const {
    return _statement.getColumn(column).getInt64();
}

std::string Database::Row::text(int column) const {
    return _statement.getColumn(column).getString();
}

Database::Database(std::unique_ptr<Connection> connection) : _connection(std::move(connection)) {}

Database::~Database() = default;

std::expected<std::unique_ptr<Database>, Error> Database::open(const std::filesystem::path& path,
                                                               Access access,
                                                               std::chrono::milliseconds patience) {
    if (access != Access::create) {
        if (auto checked = checkFiles(path); !checked) {
            return std::unexpected(std::move(checked.error()));
        }
    }
    const int busyTimeout = static_cast<int>(patience.count());
    const bool foundPendingChanges = hasPendingChanges(path);
    try {
        SQLite::Database database = openWith(access, path, busyTimeout);
        database.exec("PRAGMA foreign_keys = ON");
        return std::unique_ptr<Database>(new Database(
            std::make_unique<Connection>(path, foundPendingChanges, std::move(database),
                                         std::map<std::string, SQLite::Statement>())));
    } catch (const SQLite::Exception& exception) {
        return std::unexpected(databaseError(path, exception));
    }
}

std::expected<void, Error> Database::query(const std::string& sql, const Values& values,
                                           const std::function<void(const Row& row)>& useRow) {
    return _connection->guarded([&] {
        SQLite::Statement& statement = _connection->statement(sql);
        const StatementUse use(statement);
        for (std::size_t index = 0; index < values.size(); ++index) {
            const int place = static_cast<int>(index) + 1;
            if (const auto* number = std::get_if<std::int64_t>(&values[index])) {
                statement.bind(place, *number);
            } else if (const auto* text = std::get_if<std::string>(&values[index])) {
                statement.bind(place, *text);
            } else {
                statement.bind(place);
            }
        }
        const Row row(statement);
        while (statement.executeStep()) {
            useRow(row);
        }
    });
}

std::expected<void, Error> Database::execute(const std::string& sql, const Values& values) {
    return query(sql, values, [](const Row&) {});
}

std::expected<void, Error> Database::executeScript(const std::string& sql) {
    return _connection->guarded([&] { _connection->database.exec(sql); });
}

std::expected<void, Error>
Database::transaction(const std::function<std::expected<void, Error>()>& write) {
    std::expected<void, Error> written;
    const auto ended = _connection->guarded([&] {
        SQLite::Transaction transaction(_connection->database,
                                        SQLite::TransactionBehavior::IMMEDIATE);
        written = write();
        if (written) {
            transaction.commit();
        }
    });
    return written ? ended : written;
}

std::expected<std::int64_t, Error> Database::version() {
    std::int64_t version = 0;
    const auto read =
        query("PRAGMA user_version", {}, [&version](const Row& row) { version = row.integer(0); });
    if (!read) {
        return std::unexpected(read.error());
    }
    return version;
}

bool Database::tellsOfContent(const Error& error) {
    return error.domain != libraryDomain || error.code == SQLITE_NOTADB ||
           error.code == SQLITE_CORRUPT || error.code == SQLITE_ERROR;
}

void Database::leaveAsFound() {
    if (_connection->foundPendingChanges) {
        static_cast<void>(::sqlite3_db_config(_connection->database.getHandle(),
                                              SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr));
    }
}

const std::filesystem::path& Database::path() const {
    return _connection->path;
}

std::string Database::libraryVersion() {
    return SQLite::getLibVersion();
}

} // namespace nimbra::device
