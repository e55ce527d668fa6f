#pragma once

#include "device/store/Database.h"
#include "platform/values/Error.h"

#include <chrono>
#include <expected>
#include <filesystem>
#include <memory>
#include <span>
#include <string_view>

namespace nimbra::device {

/// The form of one kind of database, and how one is made, checked and brought up to date.
struct Schema {
    /// What messages call such a database: "an account database".
    std::string_view kind;
    /// The scripts that bring a database from one version to the next; the first makes a new one.
    std::span<const char* const> migrations;
    /// Statements that read its tables; where they cannot be run, the tables are not there.
    std::span<const char* const> readings;

    /// Makes a new database at `path`, where nothing stands.
    [[nodiscard]] std::expected<std::unique_ptr<Database>, Error>
    create(const std::filesystem::path& path) const;

    /// Opens the database at `path`, which an earlier version may have made. A file that is no
    /// such database, is damaged or was made by a later version is an error, and stays untouched.
    /// Reading and writing wait as long as `patience` for another program that is using the file.
    [[nodiscard]] std::expected<std::unique_ptr<Database>, Error>
    open(const std::filesystem::path& path, std::chrono::milliseconds patience) const;

    /// The same only to look at it: nothing is written, and one of an earlier version stays so.
    [[nodiscard]] std::expected<std::unique_ptr<Database>, Error>
    openForReading(const std::filesystem::path& path) const;
};

} // namespace nimbra::device
