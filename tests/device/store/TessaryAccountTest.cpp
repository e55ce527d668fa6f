#include "platform/accounts/Dataclass.h"
#include "tests/device/TestFiles.h"
#include "tests/device/store/AccountStoreFixture.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <gmock/gmock.h>

namespace nimbra::device {
namespace {

/// What an account says of the cloud database.
struct TessaryAccountTest : test::AccountStoreFixture {
    TessaryAccountTest() {
        auto database = AccountDatabase::open(path());
        EXPECT_TRUE(
            database->replaceAccounts({{.identifier = "primary",
                                        .primary = true,
                                        .provisioned = {"kAccountDataclassTSYDatabaseService"},
                                        .tessaryAccount = "elsewhere"},
                                       {.identifier = "second", .tessaryAccount = "third"},
                                       {.identifier = "third",
                                        .usesStratafile = true,
                                        .enabled = {"kAccountDataclassTSYDatabaseService"}}}));
    }

    [[nodiscard]] std::shared_ptr<Account> account(const char* identifier) {
        return store->accountWithIdentifier(AccountIdentifier(identifier));
    }

    std::unique_ptr<DeviceAccountStore> store = openStore();
};

TEST_F(TessaryAccountTest, OnlyTheUsersOwnAccountIsPrimary) {
    EXPECT_TRUE(account("primary")->vt_isPrimaryAccount());
    EXPECT_FALSE(account("second")->vt_isPrimaryAccount());
}

TEST_F(TessaryAccountTest, BeingProvisionedHasNothingToDoWithBeingEnabled) {
    EXPECT_TRUE(account("primary")->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_FALSE(account("primary")->isEnabledForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_FALSE(account("third")->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_TRUE(account("third")->isEnabledForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_FALSE(account("primary")->isProvisionedForDataclass(kAccountDataclassTidewater));
}

TEST_F(TessaryAccountTest, AnAccountOfTheDatabaseThatTheStoreHoldsIsTheStoredOne) {
    const auto third = account("second")->vt_tessaryAccount();

    ASSERT_NE(third, nullptr);
    EXPECT_EQ(third->identifier(), AccountIdentifier("third"));
    EXPECT_TRUE(third->vt_isUsingStratafile());
    EXPECT_TRUE(third->isEnabledForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(TessaryAccountTest, OneThatTheStoreDoesNotHoldHasItsIdentifierAlone) {
    const auto elsewhere = account("primary")->vt_tessaryAccount();

    ASSERT_NE(elsewhere, nullptr);
    EXPECT_EQ(elsewhere->identifier(), AccountIdentifier("elsewhere"));
    EXPECT_FALSE(elsewhere->vt_isPrimaryAccount());
    EXPECT_FALSE(elsewhere->vt_isUsingStratafile());
    EXPECT_EQ(elsewhere->vt_tessaryAccount(), nullptr);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(TessaryAccountTest, OneThatTheStoreDoesNotHoldCannotBeSaved) {
    const auto elsewhere = account("primary")->vt_tessaryAccount();
    elsewhere->setEnabledForDataclass(true, kAccountDataclassTidewater);

    const auto saved = store->save(elsewhere);

    ASSERT_FALSE(saved);
    EXPECT_THAT(saved.error().description, testing::HasSubstr("no such account"));
}

TEST_F(TessaryAccountTest, AnAccountMayHaveNone) {
    EXPECT_EQ(account("third")->vt_tessaryAccount(), nullptr);
}

TEST_F(TessaryAccountTest, AReloadBringsWhatTheStoreHoldsNow) {
    const auto primary = account("primary");
    auto database = AccountDatabase::open(path());
    ASSERT_TRUE(database->replaceAccounts({{.identifier = "primary"}}));

    EXPECT_TRUE(primary->vt_isPrimaryAccount());
    primary->reload();

    EXPECT_FALSE(primary->vt_isPrimaryAccount());
    EXPECT_FALSE(primary->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_EQ(primary->vt_tessaryAccount(), nullptr);
}

TEST_F(TessaryAccountTest, ASaveKeepsAllOfIt) {
    const auto primary = account("primary");
    primary->setEnabledForDataclass(true, kAccountDataclassTSYDatabaseService);
    ASSERT_TRUE(store->save(primary));

    const auto again = stored();

    EXPECT_TRUE(again->vt_isPrimaryAccount());
    EXPECT_TRUE(again->isProvisionedForDataclass(kAccountDataclassTSYDatabaseService));
    EXPECT_EQ(again->vt_tessaryAccount()->identifier(), AccountIdentifier("elsewhere"));
}

TEST_F(TessaryAccountTest, WhereTheStoreCannotBeReadTheIdentifierIsLeft) {
    const auto second = account("second");
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE)
        .exec("DROP TABLE account_dataclasses");

    const auto third = second->vt_tessaryAccount();

    ASSERT_NE(third, nullptr);
    EXPECT_EQ(third->identifier(), AccountIdentifier("third"));
    EXPECT_FALSE(third->vt_isUsingStratafile());
    EXPECT_EQ(log.lines().size(), 1U);
}

} // namespace
} // namespace nimbra::device
