#pragma once

#include "platform/values/Error.h"

#include <chrono>
#include <cstdint>
#include <expected>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <variant>
#include <vector>

namespace SQLite {
class Statement;
}

namespace nimbra::device {

/// One connection to an SQLite database: the only place that calls the library. Errors begin with
/// the file's path. Not thread-safe.
class Database {
public:
    /// What a placeholder of a statement is filled with.
    using Value = std::variant<std::nullptr_t, std::int64_t, std::string>;
    using Values = std::vector<Value>;

    /// One row of a result, while it is handed out; columns count from 0.
    class Row {
    public:
        explicit Row(SQLite::Statement& statement) : _statement(statement) {}
        [[nodiscard]] bool isNull(int column) const;
        [[nodiscard]] std::int64_t integer(int column) const;
        [[nodiscard]] std::string text(int column) const;

    private:
        SQLite::Statement& _statement;
    };

    enum class Access { existing, create, reading };

    /// How long a statement waits for another program that is using the file.
    static constexpr std::chrono::milliseconds patience{5000};

    /// Opens the file at `path`; with `create` it is made where it does not exist. Where the file
    /// can only be read, or the disk has no room for the files beside it, reading works and writing
    /// fails, as long as it is open. With `reading` nothing can be written, and neither the file
    /// nor the changes that stand beside it are touched.
    [[nodiscard]] static std::expected<std::unique_ptr<Database>, Error>
    open(const std::filesystem::path& path, Access access,
         std::chrono::milliseconds patience = Database::patience);

    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;
    ~Database();

    /// Runs one statement and hands its rows to `useRow`. The statement stays prepared.
    [[nodiscard]] std::expected<void, Error>
    query(const std::string& sql, const Values& values,
          const std::function<void(const Row& row)>& useRow);
    /// Runs one statement without a result. The statement stays prepared.
    [[nodiscard]] std::expected<void, Error> execute(const std::string& sql, const Values& values);
    /// Runs several statements, once.
    [[nodiscard]] std::expected<void, Error> executeScript(const std::string& sql);

    /// Runs `write` as one transaction, which takes the right to write first and is undone when
    /// `write` or the end fails.
    [[nodiscard]] std::expected<void, Error>
    transaction(const std::function<std::expected<void, Error>()>& write);

    /// The version of its form, which whoever made it has set; 0 where nobody has.
    [[nodiscard]] std::expected<std::int64_t, Error> version();

    /// Whether `error`, which an operation here has given, says that the file is no database, a
    /// damaged one or one of another form; others say what kept it from being read or written.
    [[nodiscard]] static bool tellsOfContent(const Error& error);

    /// Leaves the files as they were found when the connection ends: changes that another process
    /// left beside the database are not moved into it.
    void leaveAsFound();

    [[nodiscard]] const std::filesystem::path& path() const;

    /// The version of the library that reads and writes databases.
    [[nodiscard]] static std::string libraryVersion();

private:
    struct Connection;
    explicit Database(std::unique_ptr<Connection> connection);

    std::unique_ptr<Connection> _connection;
};

} // namespace nimbra::device
