#include "device/store/DeviceAccount.h"
#include "tests/device/FullDisk.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/store/AccountStoreFixture.h"
#include "tests/support/FakeAccount.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <future>

namespace nimbra::test {
namespace {

using Saved = std::expected<void, Error>;

/// Saves that move the account "primary" to the new document service, or back from it.
struct AccountUpgradeSaveTest : AccountStoreFixture {
    AccountUpgradeSaveTest() { setStored(false); }

    /// Sets the flag in the file, as another program would.
    void setStored(bool usesStratafile) const {
        SQLite::Database(path().string(), SQLite::OPEN_READWRITE)
            .exec(usesStratafile ? "UPDATE accounts SET uses_stratafile = 1"
                                 : "UPDATE accounts SET uses_stratafile = 0");
    }
    /// Saves as a page does and waits for the completion.
    [[nodiscard]] static Saved save(device::DeviceAccountStore& store,
                                    const std::shared_ptr<Account>& account, bool doVerify = true) {
        std::promise<Saved> ended;
        store.saveAccount(account,
                          {.doVerify = doVerify,
                           .completion = [&ended](const Saved& saved) { ended.set_value(saved); }});
        return ended.get_future().get();
    }
    [[nodiscard]] static std::shared_ptr<device::DeviceAccount>
    changedAccountOf(device::DeviceAccountStore& store) {
        const auto account = std::dynamic_pointer_cast<device::DeviceAccount>(primaryOf(store));
        account->vt_setUsesStratafile(true);
        account->setEnabledForDataclass(false, kAccountDataclassLarder);
        return account;
    }
};

TEST_F(AccountUpgradeSaveTest, TheFlagChangesInTheObjectOnlyUntilItIsSaved) {
    const auto store = openStore();
    const auto account = primaryOf(*store);
    EXPECT_FALSE(account->vt_isUsingStratafile());

    account->vt_setUsesStratafile(true);

    EXPECT_TRUE(account->vt_isUsingStratafile());
    EXPECT_FALSE(primaryOf(*store)->vt_isUsingStratafile());
    EXPECT_FALSE(stored()->vt_isUsingStratafile());
}

TEST_F(AccountUpgradeSaveTest, ASaveIsThereForANewConnectionAndLeavesNothingToSave) {
    for (const bool doVerify : {true, false}) {
        setStored(false);
        const auto store = openStore();
        const auto account = changedAccountOf(*store);

        EXPECT_TRUE(save(*store, account, doVerify));

        EXPECT_TRUE(stored()->vt_isUsingStratafile());
        EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassLarder));
        EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
        EXPECT_TRUE(account->vt_isUsingStratafile());
        EXPECT_EQ(account->changes(), device::AccountChanges());
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(AccountUpgradeSaveTest, TheFlagCanBeTakenBack) {
    setStored(true);
    const auto store = openStore();
    const auto account = primaryOf(*store);
    account->vt_setUsesStratafile(false);

    EXPECT_TRUE(save(*store, account));

    EXPECT_FALSE(stored()->vt_isUsingStratafile());
}

TEST_F(AccountUpgradeSaveTest, TwoStoresDoNotTakeBackEachOthersChanges) {
    const auto first = openStore();
    const auto second = openStore();
    const auto ofFirst = primaryOf(*first);
    const auto ofSecond = primaryOf(*second);
    ofFirst->vt_setUsesStratafile(true);
    ofSecond->setEnabledForDataclass(false, kAccountDataclassTidewater);

    EXPECT_TRUE(save(*first, ofFirst));
    EXPECT_TRUE(save(*second, ofSecond));

    EXPECT_TRUE(stored()->vt_isUsingStratafile());
    EXPECT_FALSE(stored()->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(ofSecond->vt_isUsingStratafile());
    ofSecond->reload();
    EXPECT_TRUE(ofSecond->vt_isUsingStratafile());
}

TEST_F(AccountUpgradeSaveTest, AReloadDropsTheFlagThatWasNotSaved) {
    const auto store = openStore();
    const auto account = changedAccountOf(*store);

    account->reload();

    EXPECT_FALSE(account->vt_isUsingStratafile());
    EXPECT_TRUE(account->isEnabledForDataclass(kAccountDataclassLarder));
    EXPECT_EQ(account->changes(), device::AccountChanges());
}

TEST_F(AccountUpgradeSaveTest, AFlagThatIsTakenBackDuringASaveIsStillAChangeAfterIt) {
    const auto store = openStore();
    const auto account = changedAccountOf(*store);
    const device::AccountChanges saved = account->changes();
    account->vt_setUsesStratafile(false);

    account->didSave(saved);

    EXPECT_FALSE(account->vt_isUsingStratafile());
    EXPECT_EQ(account->changes(), (device::AccountChanges{.usesStratafile = false}));
}

TEST_F(AccountUpgradeSaveTest, ASaveThatFailsChangesNothingAndCanBeMadeAgain) {
    const auto store = openStore();
    const auto account = changedAccountOf(*store);
    {
        const FullDisk fullDisk;
        EXPECT_FALSE(save(*store, account));
    }
    EXPECT_EQ(log.lines().size(), 1U);
    EXPECT_FALSE(stored()->vt_isUsingStratafile());
    EXPECT_TRUE(stored()->isEnabledForDataclass(kAccountDataclassLarder));
    EXPECT_TRUE(account->vt_isUsingStratafile());

    EXPECT_TRUE(save(*store, account));

    EXPECT_TRUE(stored()->vt_isUsingStratafile());
}

TEST_F(AccountUpgradeSaveTest, AReadOnlyDatabaseFailsTheSaveWithOneLine) {
    {
        const ReadOnly readOnly(directory.path());
        const auto store = openStore();

        const Saved saved = store->save(changedAccountOf(*store));

        ASSERT_FALSE(saved);
        EXPECT_EQ(saved.error().description, "/var/lib/nimbra/accounts.db: it can only be read");
        EXPECT_EQ(log.lines().size(), 1U);
    }
    EXPECT_FALSE(stored()->vt_isUsingStratafile());
}

TEST_F(AccountUpgradeSaveTest, PlannedOutcomesAreUsedUpOneASave) {
    const auto store = openStore();
    const auto account = changedAccountOf(*store);
    const Error planned{"test", 1, "planned"};
    store->planSaveOutcomes({planned, std::nullopt, planned});

    EXPECT_EQ(save(*store, account), std::unexpected(planned));
    EXPECT_FALSE(stored()->vt_isUsingStratafile());
    EXPECT_TRUE(save(*store, account));
    EXPECT_TRUE(stored()->vt_isUsingStratafile());
    EXPECT_EQ(save(*store, nullptr), std::unexpected(planned));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(AccountUpgradeSaveTest, NoAccountCannotBeSavedByEitherWay) {
    const auto store = openStore();
    std::promise<Saved> ended;

    const Saved saved = save(*store, nullptr);
    store->saveVerifiedAccountWithCompletionHandler(
        nullptr, [&ended](const Saved& verified) { ended.set_value(verified); });
    const Saved verified = ended.get_future().get();

    ASSERT_FALSE(saved);
    EXPECT_EQ(saved.error().description, "there is no account to be saved");
    EXPECT_EQ(verified, saved);
    EXPECT_EQ(log.lines(),
              std::vector<std::string>(2, "Can't save account: there is no account to be saved"));
}

TEST_F(AccountUpgradeSaveTest, AnAccountOfAnotherKindCannotBeSaved) {
    const auto store = openStore();

    const Saved saved = save(*store, std::make_shared<FakeAccount>("primary"));

    ASSERT_FALSE(saved);
    EXPECT_EQ(saved.error().description, "the account is not of this store");
    EXPECT_EQ(log.lines(), std::vector<std::string>{
                               "Can't save account primary: the account is not of this store"});
}

} // namespace
} // namespace nimbra::test
