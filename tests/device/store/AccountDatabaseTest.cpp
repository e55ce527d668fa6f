#include "device/store/AccountDatabase.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <algorithm>
#include <array>
#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace nimbra::device {
namespace {

using Identifiers = std::vector<AccountIdentifier>;

class AccountDatabaseTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path directory() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path path() const { return directory() / "accounts.db"; }

    void create(const std::vector<DeviceDescription::AccountDescription>& accounts) const {
        auto database = AccountDatabase::create(path());
        ASSERT_TRUE(database) << database.error();
        const auto written = database->replaceAccounts(accounts);
        ASSERT_TRUE(written) << written.error();
    }

    [[nodiscard]] AccountDatabase open() const {
        auto database = AccountDatabase::open(path());
        EXPECT_TRUE(database) << database.error();
        return std::move(*database);
    }

    /// Runs `sql` as another program would.
    void execute(const std::string& sql) const {
        SQLite::Database(path().string(), SQLite::OPEN_READWRITE).exec(sql);
    }

    /// Expects that opening fails for `reason` and leaves every byte as it was.
    void expectRefusal(const std::string& reason) const {
        const auto before = test::treeOf(directory());
        const auto database = AccountDatabase::open(path());
        ASSERT_FALSE(database);
        EXPECT_EQ(database.error().description, path().string() + ": " + reason);
        EXPECT_EQ(test::treeOf(directory()), before);
    }
    void expectNoDatabase(const std::string& reason) const {
        expectRefusal("not an account database: " + reason);
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(AccountDatabaseTest, AccountsAreKeptInTheirOrder) {
    create({{.identifier = "z"}, {.identifier = "a"}, {.identifier = "m"}});

    EXPECT_EQ(
        open().accountIdentifiers(),
        (Identifiers{AccountIdentifier("z"), AccountIdentifier("a"), AccountIdentifier("m")}));
}

TEST_F(AccountDatabaseTest, AnAccountIsReadWithItsFlags) {
    create({{.identifier = "other", .enabled = {"kAccountDataclassLarder"}},
            {.identifier = "a",
             .usesStratafile = true,
             .enabled = {"kAccountDataclassTidewater"},
             .provisioned = {"kAccountDataclassTidewater", "kAccountDataclassKeyValue"},
             .cellular = {"kAccountDataclassKeyValue"}}});

    const auto record = open().account(AccountIdentifier("a"));

    ASSERT_TRUE(record) << record.error();
    ASSERT_TRUE(*record);
    EXPECT_EQ((*record)->identifier, AccountIdentifier("a"));
    EXPECT_TRUE((*record)->usesStratafile);
    EXPECT_EQ((*record)->enabled, std::set{kAccountDataclassTidewater});
}

TEST_F(AccountDatabaseTest, EveryFlagIsKept) {
    create({{.identifier = "a",
             .primary = true,
             .enabled = {"kAccountDataclassTidewater"},
             .provisioned = {"kAccountDataclassKeyValue"},
             .cellular = {"kAccountDataclassKeyValue"},
             .tessaryAccount = "t"}});

    const SQLite::Database database(path().string());
    SQLite::Statement account(database, "SELECT is_primary, uses_stratafile, tessary_account "
                                        "FROM accounts");
    ASSERT_TRUE(account.executeStep());
    EXPECT_EQ(account.getColumn(0).getInt(), 1);
    EXPECT_EQ(account.getColumn(1).getInt(), 0);
    EXPECT_EQ(account.getColumn(2).getString(), "t");
    SQLite::Statement rows(database, "SELECT group_concat(dataclass || enabled || provisioned || "
                                     "cellular) FROM account_dataclasses ORDER BY dataclass");
    ASSERT_TRUE(rows.executeStep());
    EXPECT_EQ(rows.getColumn(0).getString(),
              "kAccountDataclassKeyValue011,kAccountDataclassTidewater100");
}

TEST_F(AccountDatabaseTest, AnAccountWithoutDataclassesIsAnAccount) {
    create({{.identifier = "a"}});

    const auto record = open().account(AccountIdentifier("a"));

    ASSERT_TRUE(record && *record);
    EXPECT_FALSE((*record)->usesStratafile);
    EXPECT_TRUE((*record)->enabled.empty());
}

TEST_F(AccountDatabaseTest, AnUnknownAccountIsNoError) {
    create({});

    const auto record = open().account(AccountIdentifier("nobody"));

    ASSERT_TRUE(record) << record.error();
    EXPECT_FALSE(*record);
}

TEST_F(AccountDatabaseTest, AReplacementThatFailsLeavesTheOldAccounts) {
    create({{.identifier = "a", .enabled = {"kAccountDataclassTidewater"}}});
    AccountDatabase database = open();

    const auto written = database.replaceAccounts({{.identifier = "b"}, {.identifier = "b"}});

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description,
              path().string() + ": UNIQUE constraint failed: accounts.identifier");
    EXPECT_EQ(database.accountIdentifiers(), Identifiers{AccountIdentifier("a")});
    EXPECT_EQ(database.account(AccountIdentifier("a")).value()->enabled,
              std::set{kAccountDataclassTidewater});
}

TEST_F(AccountDatabaseTest, ReplacedAccountsTakeTheirDataclassesWithThem) {
    create({{.identifier = "a", .enabled = {"kAccountDataclassTidewater"}}});

    ASSERT_TRUE(open().replaceAccounts({}));

    SQLite::Database database(path().string());
    EXPECT_EQ(database.execAndGet("SELECT count(*) FROM account_dataclasses").getInt(), 0);
}

TEST_F(AccountDatabaseTest, WhichDocumentStorageAnAccountUsesIsWrittenOnlyWhereItChanged) {
    create({{.identifier = "a"}, {.identifier = "b", .usesStratafile = true}});
    AccountDatabase database = open();
    const auto uses = [&database](const char* identifier) {
        return database.account(AccountIdentifier(identifier)).value()->usesStratafile;
    };

    ASSERT_TRUE(database.writeChanges(AccountIdentifier("a"), {.usesStratafile = true}));
    EXPECT_TRUE(uses("a"));
    ASSERT_TRUE(database.writeChanges(AccountIdentifier("b"), {.usesStratafile = false}));
    EXPECT_FALSE(uses("b"));
    ASSERT_TRUE(database.writeChanges(AccountIdentifier("a"),
                                      {.enabled = {{kAccountDataclassTidewater, true}}}));
    EXPECT_TRUE(uses("a"));
    EXPECT_FALSE(uses("b"));
}

TEST_F(AccountDatabaseTest, ChangesThatCannotAllBeWrittenLeaveTheOldState) {
    create({{.identifier = "a"}});
    AccountDatabase database = open();
    execute("CREATE TRIGGER refusal BEFORE INSERT ON account_dataclasses "
            "BEGIN SELECT RAISE(ABORT, 'refused'); END");

    const auto written = database.writeChanges(
        AccountIdentifier("a"),
        {.usesStratafile = true, .enabled = {{kAccountDataclassTidewater, true}}});

    EXPECT_FALSE(written);
    EXPECT_FALSE(database.account(AccountIdentifier("a")).value()->usesStratafile);
}

TEST_F(AccountDatabaseTest, ChangesOfAnotherProcessAreSeen) {
    create({{.identifier = "a"}});
    AccountDatabase database = open();
    ASSERT_FALSE(database.account(AccountIdentifier("a")).value()->usesStratafile);

    execute("UPDATE accounts SET uses_stratafile = 1");

    EXPECT_TRUE(database.account(AccountIdentifier("a")).value()->usesStratafile);
}

TEST_F(AccountDatabaseTest, OpeningAndReadingLeavesTheFilesAsTheyWere) {
    create({{.identifier = "a"}});
    const auto before = test::treeOf(directory());

    EXPECT_TRUE(open().accountIdentifiers());

    EXPECT_EQ(test::treeOf(directory()), before);
    EXPECT_EQ(before.size(), 1U);
}

TEST_F(AccountDatabaseTest, AMissingDatabaseIsReportedAndNotMade) {
    expectRefusal("cannot be read: No such file or directory");
}

TEST_F(AccountDatabaseTest, ADirectoryInItsPlaceIsReported) {
    std::filesystem::create_directory(path());
    expectRefusal("cannot be read: Is a directory");
}

TEST_F(AccountDatabaseTest, AFileThatIsNoDatabaseIsReportedAndLeftAsItWas) {
    test::writeTestFile(path(), std::string(5000, 'x'));
    expectNoDatabase("file is not a database");
}

TEST_F(AccountDatabaseTest, AnEmptyFileIsReportedAndLeftAsItWas) {
    test::writeTestFile(path(), "");
    expectNoDatabase("it has no version");
}

TEST_F(AccountDatabaseTest, ADatabaseOfAnotherProgramIsReportedAndLeftAsItWas) {
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE)
        .exec("CREATE TABLE notes (t); PRAGMA user_version = 1");
    expectNoDatabase("no such table: accounts");
}

TEST_F(AccountDatabaseTest, ADatabaseOfALaterVersionIsReportedAndLeftAsItWas) {
    create({{.identifier = "a"}});
    execute("PRAGMA user_version = 7");
    expectNoDatabase("it has version 7, this program knows up to 1");
}

TEST_F(AccountDatabaseTest, ADamagedDatabaseIsReportedAndLeftAsItWas) {
    std::vector<DeviceDescription::AccountDescription> accounts(200);
    for (std::size_t index = 0; index < accounts.size(); ++index) {
        accounts[index].identifier = "account " + std::to_string(index);
    }
    create(accounts);
    std::string bytes = test::contentOf(path());
    // Every page but the first, which names the tables.
    std::ranges::fill(bytes.begin() + 4096, bytes.end(), '\xa5');
    test::writeTestFile(path(), bytes);

    const auto before = test::treeOf(directory());
    const auto database = AccountDatabase::open(path());

    ASSERT_FALSE(database);
    EXPECT_TRUE(database.error().description.starts_with(
        path().string() + ": not an account database: it is damaged: "))
        << database.error();
    EXPECT_EQ(test::treeOf(directory()), before);
}

TEST_F(AccountDatabaseTest, ATruncatedDatabaseIsReportedAndLeftAsItWas) {
    create({{.identifier = "a"}});
    std::filesystem::resize_file(path(), std::filesystem::file_size(path()) / 2);
    const auto before = test::treeOf(directory());

    EXPECT_FALSE(AccountDatabase::open(path()));

    EXPECT_EQ(test::treeOf(directory()), before);
}

TEST_F(AccountDatabaseTest, ARefusedDatabaseKeepsThePendingChangesOfAKilledProcess) {
    create({{.identifier = "a"}});
    const std::string main = test::contentOf(path());
    std::string pending;
    {
        SQLite::Database writer(path().string(), SQLite::OPEN_READWRITE);
        writer.exec("PRAGMA user_version = 9");
        pending = test::contentOf(path().string() + "-wal");
    }
    // As the process left them that was killed before it could tidy up.
    test::writeTestFile(path(), main);
    test::writeTestFile(path().string() + "-wal", pending);

    const auto database = AccountDatabase::open(path());

    ASSERT_FALSE(database);
    EXPECT_TRUE(database.error().description.contains("it has version 9")) << database.error();
    EXPECT_EQ(test::contentOf(path()), main);
    EXPECT_EQ(test::contentOf(path().string() + "-wal"), pending);
}

TEST_F(AccountDatabaseTest, PendingChangesOfAKilledProcessAreTakenOver) {
    create({{.identifier = "a"}});
    const std::string main = test::contentOf(path());
    std::string pending;
    {
        SQLite::Database writer(path().string(), SQLite::OPEN_READWRITE);
        writer.exec("UPDATE accounts SET identifier = 'b'");
        pending = test::contentOf(path().string() + "-wal");
    }
    test::writeTestFile(path(), main);
    test::writeTestFile(path().string() + "-wal", pending);

    EXPECT_EQ(open().accountIdentifiers(), Identifiers{AccountIdentifier("b")});
}

TEST_F(AccountDatabaseTest, WhereNothingCanBeWrittenTheAccountsAreStillListed) {
    create({{.identifier = "a"}});
    const auto isReadInLockedDirectory = [this] {
        constexpr uid_t nobody = 65534;
        // A superuser would be let through whatever the permissions say.
        if (::getuid() == 0 && ::setuid(nobody) != 0) {
            return false;
        }
        auto database = AccountDatabase::open(path());
        return database && database->accountIdentifiers() == Identifiers{AccountIdentifier("a")} &&
               !database->replaceAccounts({});
    };
    ASSERT_EQ(::chmod(path().c_str(), 0444), 0);
    ASSERT_EQ(::chmod(directory().c_str(), 0555), 0);

    EXPECT_EXIT(std::_Exit(isReadInLockedDirectory() ? 0 : 1), testing::ExitedWithCode(0), "");

    ASSERT_EQ(::chmod(directory().c_str(), 0755), 0);
}

TEST_F(AccountDatabaseTest, EverythingThatIsKeptCanBeReadBack) {
    create({{.identifier = "z",
             .primary = true,
             .usesStratafile = true,
             .enabled = {"a", "b"},
             .provisioned = {"b"},
             .cellular = {"c"},
             .tessaryAccount = "t"},
            {.identifier = "y"}});

    const auto accounts = open().accounts();

    ASSERT_TRUE(accounts) << accounts.error();
    ASSERT_EQ(accounts->size(), 2U);
    const auto& first = accounts->front();
    EXPECT_EQ(first.identifier, "z");
    EXPECT_TRUE(first.primary);
    EXPECT_TRUE(first.usesStratafile);
    EXPECT_EQ(first.enabled, (std::set<std::string>{"a", "b"}));
    EXPECT_EQ(first.provisioned, std::set<std::string>{"b"});
    EXPECT_EQ(first.cellular, std::set<std::string>{"c"});
    EXPECT_EQ(first.tessaryAccount, "t");
    const auto& last = accounts->back();
    EXPECT_EQ(last.identifier, "y");
    EXPECT_FALSE(last.primary);
    EXPECT_TRUE(last.enabled.empty());
    EXPECT_EQ(last.tessaryAccount, std::nullopt);
}

TEST_F(AccountDatabaseTest, WhoOnlyReadsMakesNoFilesAndCannotWrite) {
    create({{.identifier = "z"}});
    const auto before = test::treeOf(directory());

    {
        auto database = AccountDatabase::openForReading(path());
        ASSERT_TRUE(database) << database.error();
        EXPECT_EQ(database->version(), 1);
        EXPECT_EQ(database->accounts()->size(), 1U);
        const auto written =
            database->writeChanges(AccountIdentifier("z"), {.usesStratafile = true});
        ASSERT_FALSE(written);
        EXPECT_EQ(written.error().description, path().string() + ": it can only be read");
        EXPECT_EQ(test::treeOf(directory()), before);
    }

    EXPECT_EQ(test::treeOf(directory()), before);
}

TEST_F(AccountDatabaseTest, WhoOnlyReadsLeavesTheChangesOfOthersWhereTheyAre) {
    create({{.identifier = "z"}});
    SQLite::Database other(path().string(), SQLite::OPEN_READWRITE);
    other.exec("UPDATE accounts SET uses_stratafile = 1");
    const std::string changes = test::contentOf(path().string() + "-wal");

    {
        auto database = AccountDatabase::openForReading(path());
        ASSERT_TRUE(database) << database.error();
        EXPECT_TRUE(database->accounts()->front().usesStratafile);
    }

    EXPECT_EQ(test::contentOf(path().string() + "-wal"), changes);
}

TEST_F(AccountDatabaseTest, WhatIsNoDatabaseIsNotReadEither) {
    test::writeTestFile(path(), "no database");
    const auto before = test::treeOf(directory());

    const auto database = AccountDatabase::openForReading(path());

    ASSERT_FALSE(database);
    EXPECT_TRUE(
        database.error().description.starts_with(path().string() + ": not an account database: "));
    EXPECT_FALSE(AccountDatabase::openForReading(directory() / "missing.db"));
    EXPECT_EQ(test::treeOf(directory()), before);
}

} // namespace
} // namespace nimbra::device
