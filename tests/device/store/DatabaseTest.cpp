#include "device/store/Database.h"

#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace nimbra::device {
namespace {

class DatabaseTest : public testing::Test {
protected:
    DatabaseTest() : _database(open()) {
        EXPECT_TRUE(_database->executeScript("CREATE TABLE t (a INTEGER UNIQUE, b TEXT)"));
    }

    [[nodiscard]] std::filesystem::path path() const { return _directory.path() / "test.db"; }

    [[nodiscard]] std::unique_ptr<Database> open() const {
        auto database = Database::open(path(), Database::Access::create);
        EXPECT_TRUE(database) << database.error();
        return std::move(*database);
    }

    [[nodiscard]] std::vector<std::string> rows() const {
        std::vector<std::string> rows;
        const auto read = _database->query(
            "SELECT a, b FROM t ORDER BY a", {}, [&rows](const Database::Row& row) {
                rows.push_back(std::to_string(row.integer(0)) + (row.isNull(1) ? "" : row.text(1)));
            });
        EXPECT_TRUE(read) << read.error();
        return rows;
    }

    [[nodiscard]] std::expected<void, Error> insert(std::int64_t number,
                                                    Database::Value text) const {
        return _database->execute("INSERT INTO t VALUES (?, ?)", {number, std::move(text)});
    }

    [[nodiscard]] Database& database() const { return *_database; }

private:
    test::TemporaryDirectory _directory;
    std::unique_ptr<Database> _database;
};

TEST_F(DatabaseTest, AKeptStatementForgetsItsEarlierValues) {
    ASSERT_TRUE(insert(1, "x"));
    ASSERT_TRUE(insert(2, nullptr));

    EXPECT_EQ(rows(), (std::vector<std::string>{"1x", "2"}));
}

TEST_F(DatabaseTest, AStatementThatFailedCanBeUsedAgain) {
    ASSERT_TRUE(insert(1, "x"));

    const auto failed = insert(1, "y");

    ASSERT_FALSE(failed);
    EXPECT_EQ(failed.error().description, path().string() + ": UNIQUE constraint failed: t.a");
    EXPECT_EQ(failed.error().domain, "SQLite");
    EXPECT_TRUE(insert(2, "z"));
    EXPECT_EQ(rows(), (std::vector<std::string>{"1x", "2z"}));
}

TEST_F(DatabaseTest, AStatementThatIsNoSqlIsAnError) {
    const auto failed = database().execute("SELEKT 1", {});

    ASSERT_FALSE(failed);
    EXPECT_EQ(failed.error().description, path().string() + ": near \"SELEKT\": syntax error");
}

TEST_F(DatabaseTest, ATransactionThatFailsIsUndone) {
    const auto failed = database().transaction([this]() -> std::expected<void, Error> {
        EXPECT_TRUE(insert(1, "x"));
        return std::unexpected(Error{.domain = "test", .code = 3, .description = "no"});
    });

    ASSERT_FALSE(failed);
    EXPECT_EQ(failed.error().code, 3);
    EXPECT_TRUE(rows().empty());
    EXPECT_TRUE(database().transaction([this] { return insert(1, "y"); }));
    EXPECT_EQ(rows(), std::vector<std::string>{"1y"});
}

TEST_F(DatabaseTest, AMissingFileIsNotMade) {
    const auto missing = path().parent_path() / "missing.db";

    const auto opened = Database::open(missing, Database::Access::existing);

    ASSERT_FALSE(opened);
    EXPECT_EQ(opened.error().description,
              missing.string() + ": cannot be read: No such file or directory");
    EXPECT_FALSE(std::filesystem::exists(missing));
}

TEST_F(DatabaseTest, AFileThatMayNotBeReadIsReportedWithTheReason) {
    using std::filesystem::perms;
    const auto other = path().parent_path() / "other";
    std::filesystem::create_directory(other);
    std::filesystem::permissions(path().parent_path(), perms(0755));
    std::filesystem::permissions(path(), perms::none);

    for (const auto access : {Database::Access::existing, Database::Access::reading}) {
        // Root may read everything, so the test is somebody else for a while.
        const test::ReadOnly readOnly(other);
        const auto opened = Database::open(path(), access);

        ASSERT_FALSE(opened);
        EXPECT_EQ(opened.error().description,
                  path().string() + ": cannot be read: Permission denied");
    }
}

TEST_F(DatabaseTest, APipeInItsPlaceOrBesideItIsNotWaitedFor) {
    const auto other = path().parent_path() / "other.db";
    for (const auto access : {Database::Access::existing, Database::Access::reading}) {
        for (const std::string suffix : {"", "-journal", "-wal", "-shm"}) {
            std::filesystem::copy_file(path(), other);
            const auto pipe = std::filesystem::path(other.string() + suffix);
            std::filesystem::remove(pipe);
            ASSERT_EQ(::mkfifo(pipe.c_str(), 0644), 0);

            const auto opened = Database::open(other, access);

            ASSERT_FALSE(opened) << suffix;
            EXPECT_EQ(opened.error().description, pipe.string() + ": is not a plain file");
            std::filesystem::remove(pipe);
            std::filesystem::remove(other);
        }
    }
}

TEST_F(DatabaseTest, WhatALinkBesideItLeadsToIsNotRead) {
    const auto other = path().parent_path() / "other.db";
    std::filesystem::copy_file(path(), other);
    std::filesystem::create_symlink(path(), other.string() + "-wal");

    const auto opened = Database::open(other, Database::Access::reading);

    ASSERT_FALSE(opened);
    EXPECT_EQ(opened.error().description, other.string() + "-wal: is not a plain file");
}

TEST_F(DatabaseTest, AFileThatCannotBeMadeIsAnError) {
    const auto opened =
        Database::open(path().parent_path() / "no/such.db", Database::Access::create);

    ASSERT_FALSE(opened);
    EXPECT_EQ(opened.error().description,
              (path().parent_path() / "no/such.db").string() + ": unable to open database file");
}

} // namespace
} // namespace nimbra::device
