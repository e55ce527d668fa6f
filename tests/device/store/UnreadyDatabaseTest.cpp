#include "device/store/AccountDatabase.h"
#include "device/store/ConsentDatabase.h"
#include "tests/device/FullDisk.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <chrono>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {
namespace {

using Identifiers = std::vector<AccountIdentifier>;

constexpr std::chrono::milliseconds noPatience{0};

/// Whole databases that cannot be used as they are meant to be, or not now.
class UnreadyDatabaseTest : public testing::Test {
protected:
    UnreadyDatabaseTest() {
        auto accounts = AccountDatabase::create(path());
        EXPECT_TRUE(accounts);
        EXPECT_TRUE(accounts->replaceAccounts({{.identifier = "a"}}));
        EXPECT_TRUE(ConsentDatabase::create(consentPath()));
    }

    [[nodiscard]] std::filesystem::path directory() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path path() const { return directory() / "accounts.db"; }
    [[nodiscard]] std::filesystem::path consentPath() const { return directory() / "consent.db"; }
    [[nodiscard]] std::filesystem::path changesPath() const { return path().string() + "-wal"; }

    /// Leaves a change beside the database, as a process that was killed does.
    void leavePendingChange() const {
        const std::string main = test::contentOf(path());
        std::string pending;
        {
            SQLite::Database writer(path().string(), SQLite::OPEN_READWRITE);
            writer.exec("UPDATE accounts SET identifier = 'b'");
            pending = test::contentOf(changesPath());
        }
        test::writeTestFile(path(), main);
        test::writeTestFile(changesPath(), pending);
    }
    /// Leaves a change half written in the database, with what undoes it beside, as a process that
    /// was killed does where changes are not kept beside the database.
    void leaveHalfWrittenChange() const {
        const std::filesystem::path undoing = path().string() + "-journal";
        std::string changed;
        std::string kept;
        {
            SQLite::Database writer(path().string(), SQLite::OPEN_READWRITE);
            // What it has written is there at once.
            writer.exec("PRAGMA journal_mode = DELETE; PRAGMA synchronous = OFF; BEGIN IMMEDIATE; "
                        "UPDATE accounts SET identifier = 'b'");
            kept = test::contentOf(undoing);
            writer.exec("COMMIT");
            changed = test::contentOf(path());
        }
        test::writeTestFile(path(), changed);
        test::writeTestFile(undoing, kept);
    }

private:
    test::TemporaryDirectory _directory;
};

/// While it lives, another program has the database at `path` to itself.
class OtherProgram {
public:
    OtherProgram(const std::filesystem::path& path, const std::string& write)
        : _database(path.string(), SQLite::OPEN_READWRITE) {
        _database.exec("PRAGMA locking_mode = EXCLUSIVE");
        _database.exec(write);
    }

private:
    SQLite::Database _database;
};

TEST_F(UnreadyDatabaseTest, OneThatAnotherProgramHasToItselfIsToldAsSuch) {
    const OtherProgram other(path(), "UPDATE accounts SET identifier = 'b'");
    const OtherProgram otherOfConsent(consentPath(), "DELETE FROM consent");

    const auto accounts = AccountDatabase::open(path(), noPatience);
    const auto consent = ConsentDatabase::open(consentPath(), noPatience);

    ASSERT_FALSE(accounts);
    EXPECT_EQ(accounts.error().description, path().string() + ": another program is using it");
    ASSERT_FALSE(consent);
    EXPECT_EQ(consent.error().description,
              consentPath().string() + ": another program is using it");
}

TEST_F(UnreadyDatabaseTest, OnAFullDiskWhatStandsThereIsRead) {
    const std::string before = test::contentOf(path());
    {
        const test::FullDisk full;
        auto accounts = AccountDatabase::open(path());
        auto consent = ConsentDatabase::open(consentPath());

        ASSERT_TRUE(accounts) << accounts.error();
        EXPECT_EQ(accounts->accountIdentifiers(), Identifiers{AccountIdentifier("a")});
        const auto written =
            accounts->writeChanges(AccountIdentifier("a"), {.usesStratafile = true});
        ASSERT_FALSE(written);
        EXPECT_EQ(written.error().description, path().string() + ": it can only be read");
        ASSERT_TRUE(consent) << consent.error();
        EXPECT_TRUE((*consent)->allRecords());
    }

    EXPECT_EQ(test::contentOf(path()), before);
    auto accounts = AccountDatabase::open(path());
    ASSERT_TRUE(accounts) << accounts.error();
    EXPECT_TRUE(accounts->writeChanges(AccountIdentifier("a"), {.usesStratafile = true}));
}

TEST_F(UnreadyDatabaseTest, OnAFullDiskPendingChangesAreNotPassedOver) {
    leavePendingChange();
    const std::string before = test::contentOf(path());
    const std::string changes = test::contentOf(changesPath());
    {
        const test::FullDisk full;

        const auto accounts = AccountDatabase::open(path());

        ASSERT_FALSE(accounts);
        EXPECT_EQ(accounts.error().description,
                  path().string() + ": the disk is full or cannot be written");
    }

    EXPECT_EQ(test::contentOf(path()), before);
    EXPECT_EQ(test::contentOf(changesPath()), changes);
    auto accounts = AccountDatabase::open(path());
    ASSERT_TRUE(accounts) << accounts.error();
    EXPECT_EQ(accounts->accountIdentifiers(), Identifiers{AccountIdentifier("b")});
}

TEST_F(UnreadyDatabaseTest, OnAFullDiskChangesThatAreToBeUndoneAreNotTakenForWhatCounts) {
    leaveHalfWrittenChange();
    {
        const test::FullDisk full;

        const auto accounts = AccountDatabase::open(path());

        ASSERT_FALSE(accounts);
        EXPECT_EQ(accounts.error().description, path().string() + ": the disk cannot be written");
    }

    auto accounts = AccountDatabase::open(path());
    ASSERT_TRUE(accounts) << accounts.error();
    EXPECT_EQ(accounts->accountIdentifiers(), Identifiers{AccountIdentifier("a")});
}

} // namespace
} // namespace nimbra::device
