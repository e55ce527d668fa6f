#include "device/store/DeviceAccountStore.h"

#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/Threads.h"
#include "tests/support/PumpedQueues.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

class DeviceAccountStoreTest : public testing::Test {
protected:
    DeviceAccountStoreTest() : _store(madeDatabase(), _queues, _log) {}

    [[nodiscard]] std::filesystem::path path() const { return _directory.path() / "accounts.db"; }
    [[nodiscard]] DeviceAccountStore& store() { return _store; }
    [[nodiscard]] const test::RecordingLog& log() const { return _log; }

private:
    [[nodiscard]] AccountDatabase madeDatabase() const {
        auto database = AccountDatabase::create(path());
        EXPECT_TRUE(database) << database.error();
        EXPECT_TRUE(database->replaceAccounts({{.identifier = "b"},
                                               {.identifier = "a",
                                                .usesStratafile = true,
                                                .enabled = {"kAccountDataclassTidewater"}}}));
        return std::move(*database);
    }

    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    test::PumpedQueues _queues;
    DeviceAccountStore _store;
};

TEST_F(DeviceAccountStoreTest, AnAccountIsGivenAsTheDatabaseHasIt) {
    const auto account = store().accountWithIdentifier(AccountIdentifier("a"));
    const auto other = store().accountWithIdentifier(AccountIdentifier("b"));

    ASSERT_TRUE(account);
    EXPECT_EQ(account->identifier(), AccountIdentifier("a"));
    EXPECT_TRUE(account->vt_isUsingStratafile());
    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(account->isEnabledForDataclass(Dataclass("kAccountDataclassLarder")));
    ASSERT_TRUE(other);
    EXPECT_FALSE(other->vt_isUsingStratafile());
    EXPECT_FALSE(other->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(DeviceAccountStoreTest, EachQuestionGivesAFreshObject) {
    const auto first = store().accountWithIdentifier(AccountIdentifier("a"));
    first->setEnabledForDataclass(false, kAccountDataclassTidewater);
    first->setEnabledForDataclass(true, Dataclass("kAccountDataclassLarder"));

    const auto second = store().accountWithIdentifier(AccountIdentifier("a"));

    EXPECT_FALSE(first->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(first->isEnabledForDataclass(Dataclass("kAccountDataclassLarder")));
    EXPECT_TRUE(second->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(second->isEnabledForDataclass(Dataclass("kAccountDataclassLarder")));
}

TEST_F(DeviceAccountStoreTest, AnUnknownAccountIsNullWithoutALine) {
    EXPECT_EQ(store().accountWithIdentifier(AccountIdentifier("nobody")), nullptr);
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceAccountStoreTest, AnAccountThatCannotBeReadIsNullWithOneLine) {
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE)
        .exec("DROP TABLE account_dataclasses");

    EXPECT_EQ(store().accountWithIdentifier(AccountIdentifier("a")), nullptr);

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{"Can't read account a: /var/lib/nimbra/accounts.db"
                                       ": no such table: account_dataclasses"});
}

TEST_F(DeviceAccountStoreTest, AListThatCannotBeReadIsAnError) {
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE).exec("DROP TABLE accounts");

    const auto identifiers = store().accountIdentifiers();

    ASSERT_FALSE(identifiers);
    EXPECT_EQ(identifiers.error().description, path().string() + ": no such table: accounts");
}

TEST_F(DeviceAccountStoreTest, ManyThreadsMayAskAtOnce) {
    const auto ask = [this] {
        for (int round = 0; round < 50; ++round) {
            EXPECT_TRUE(store().accountWithIdentifier(AccountIdentifier("a")));
            EXPECT_EQ(store().accountIdentifiers()->size(), 2U);
        }
    };

    test::runAtOnce({ask, ask, ask, ask});

    EXPECT_TRUE(log().lines().empty());
}

} // namespace
} // namespace nimbra::device
