#include "device/store/DeviceAccount.h"
#include "tests/device/FullDisk.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/store/AccountStoreFixture.h"

#include <SQLiteCpp/SQLiteCpp.h>

namespace nimbra::test {
namespace {

const std::string kDatabase = "/var/lib/nimbra/accounts.db";

struct AccountSaveTest : AccountStoreFixture {};

TEST_F(AccountSaveTest, ASaveIsThereForANewConnection) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    account->setEnabledForDataclass(false, kAccountDataclassLarder);
    account->setEnabledForDataclass(true, kAccountDataclassKeyValue);
    account->vt_setUseCellularForDataclass(true, kAccountDataclassTidewater);

    ASSERT_TRUE(store->save(account));

    const auto found = stored();
    EXPECT_TRUE(found->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(found->isEnabledForDataclass(kAccountDataclassLarder));
    EXPECT_TRUE(found->isEnabledForDataclass(kAccountDataclassKeyValue));
    EXPECT_TRUE(found->vt_useCellularForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(found->vt_useCellularForDataclass(kAccountDataclassKeyValue));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(AccountSaveTest, WhatIsNotSavedIsNotThere) {
    const auto store = openStore();
    primaryOf(*store)->setEnabledForDataclass(false, kAccountDataclassTidewater);

    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(AccountSaveTest, TwoStoresThatChangeOneAccountDoNotTakeBackEachOthersChanges) {
    const auto first = openStore();
    const auto second = openStore();
    const auto ofFirst = primaryOf(*first);
    const auto ofSecond = primaryOf(*second);
    ofFirst->setEnabledForDataclass(false, kAccountDataclassTidewater);
    ofSecond->vt_setUseCellularForDataclass(true, kAccountDataclassKeyValue);

    ASSERT_TRUE(first->save(ofFirst));
    ASSERT_TRUE(second->save(ofSecond));

    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(stored()->vt_useCellularForDataclass(kAccountDataclassKeyValue));
}

TEST_F(AccountSaveTest, ReloadDropsWhatWasNotSavedAndReadsWhatOthersSaved) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    const auto other = openStore();
    const auto ofOther = primaryOf(*other);
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    ofOther->setEnabledForDataclass(false, kAccountDataclassLarder);
    ASSERT_TRUE(other->save(ofOther));

    account->reload();

    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(account->isEnabledForDataclass(kAccountDataclassLarder));
}

TEST_F(AccountSaveTest, ReloadBringsBackForBothDataClassesWhetherTheyMayUseCellular) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    account->vt_setUseCellularForDataclass(true, kAccountDataclassTidewater);
    account->vt_setUseCellularForDataclass(true, kAccountDataclassKeyValue);
    ASSERT_TRUE(store->save(account));
    account->vt_setUseCellularForDataclass(false, kAccountDataclassTidewater);
    account->vt_setUseCellularForDataclass(false, kAccountDataclassKeyValue);

    account->reload();

    EXPECT_TRUE(account->vt_useCellularForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(account->vt_useCellularForDataclass(kAccountDataclassKeyValue));
}

TEST_F(AccountSaveTest, ReloadDropsChangesAlsoWhenNothingCanBeRead) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE)
        .exec("DROP TABLE account_dataclasses");

    account->reload();

    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_EQ(log.lines().size(), 1U);
}

TEST_F(AccountSaveTest, AChangeMadeDuringASaveIsStillAChangeAfterIt) {
    const auto store = openStore();
    const auto account = std::dynamic_pointer_cast<device::DeviceAccount>(primaryOf(*store));
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    const device::AccountChanges saved = account->changes();
    account->setEnabledForDataclass(true, kAccountDataclassTidewater);

    account->didSave(saved);

    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_EQ(account->changes().enabled.size(), 1U);
}

TEST_F(AccountSaveTest, ASavedAccountHasNothingLeftToSave) {
    const auto store = openStore();
    const auto account = std::dynamic_pointer_cast<device::DeviceAccount>(primaryOf(*store));
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    account->vt_setUseCellularForDataclass(true, kAccountDataclassTidewater);

    ASSERT_TRUE(store->save(account));

    EXPECT_EQ(account->changes(), device::AccountChanges());
    EXPECT_FALSE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(account->vt_useCellularForDataclass(kAccountDataclassTidewater));
}

TEST_F(AccountSaveTest, AnAccountThatHasGoneCannotBeSaved) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE).exec("DELETE FROM accounts");
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);

    const auto saved = store->save(account);

    ASSERT_FALSE(saved);
    EXPECT_EQ(saved.error().description, kDatabase + ": holds no such account any more");
    EXPECT_EQ(log.lines(),
              std::vector<std::string>{"Can't save account primary: " + saved.error().description});
}

TEST_F(AccountSaveTest, ADatabaseInUsePastThePatienceFailsTheSaveInPlainWords) {
    const auto store = openStore(std::chrono::milliseconds(1));
    const auto account = primaryOf(*store);
    SQLite::Database other(path().string(), SQLite::OPEN_READWRITE);
    other.exec("BEGIN IMMEDIATE");
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);

    const auto saved = store->save(account);

    ASSERT_FALSE(saved);
    EXPECT_EQ(saved.error().description, kDatabase + ": another program is using it");
    EXPECT_EQ(log.lines().size(), 1U);
    other.exec("COMMIT");
    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(store->save(account));
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(AccountSaveTest, AReadOnlyDatabaseCanBeReadAndFailsTheSave) {
    {
        const ReadOnly readOnly(directory.path());
        const auto store = openStore();
        const auto account = primaryOf(*store);
        ASSERT_TRUE(account);
        account->setEnabledForDataclass(false, kAccountDataclassTidewater);

        const auto saved = store->save(account);

        ASSERT_FALSE(saved);
        EXPECT_EQ(saved.error().description, kDatabase + ": it can only be read");
        EXPECT_EQ(log.lines().size(), 1U);
    }
    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(AccountSaveTest, AFullDiskFailsTheSaveAndTheOldStateStands) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);
    {
        const FullDisk fullDisk;
        EXPECT_FALSE(store->save(account));
    }
    EXPECT_EQ(log.lines().size(), 1U);
    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(store->save(account));
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(AccountSaveTest, PlannedOutcomesAreUsedUpOneASave) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    const Error planned{"test", 1, "planned"};
    store->planSaveOutcomes({planned, std::nullopt, planned});
    account->setEnabledForDataclass(false, kAccountDataclassTidewater);

    EXPECT_EQ(store->save(account), std::unexpected(planned));
    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(store->save(account));
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_EQ(store->save(account), std::unexpected(planned));
    EXPECT_TRUE(store->save(account));
    EXPECT_TRUE(log.lines().empty());
}

} // namespace
} // namespace nimbra::test
