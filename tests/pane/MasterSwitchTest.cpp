#include "tests/pane/PaneFixture.h"

namespace nimbra::test {
namespace {

const Error kRefused{"store", 7, "refused"};

struct MasterSwitchTest : PaneFixture {
    /// Opens the pane on an account with these data classes enabled.
    void openWith(std::set<Dataclass> enabled) {
        platform.accountStore.stored.enabled = std::move(enabled);
        static_cast<void>(pane->specifiers());
    }
    void flip(bool on) { master()->setValue(on); }
    [[nodiscard]] std::shared_ptr<Specifier> master() const { return pane->specifiers().at(1); }
    [[nodiscard]] bool isEnabled(const Dataclass& dataclass) const {
        return pane->_vantrelAccount()->isEnabledForDataclass(dataclass);
    }
    [[nodiscard]] std::size_t savesUnderWay() const { return platform.accountStore.saves.size(); }
    [[nodiscard]] const Calls& calls() const { return platform.calls; }
    void pumpMain() { platform.workQueues.mainQueue().pump(); }
};

TEST_F(MasterSwitchTest, AFlipSavesTheAccountOnceWithoutVerification) {
    openWith({});

    flip(true);

    ASSERT_EQ(savesUnderWay(), 1U);
    EXPECT_EQ(platform.accountStore.saves.front().operation, "saveAccount, not verified");
    EXPECT_EQ(platform.accountStore.saves.front().account, pane->_vantrelAccount());
    EXPECT_TRUE(isEnabled(kAccountDataclassTidewater));
}

TEST_F(MasterSwitchTest, TheStoredStateAskedForAgainDoesNothingAtAll) {
    openWith({kAccountDataclassTidewater});

    flip(true);

    EXPECT_EQ(savesUnderWay(), 0U);
    EXPECT_EQ(calls(), Calls());
}

TEST_F(MasterSwitchTest, TurningOffTakesThePhotoStreamAlongAndRefreshesEveryParent) {
    openWith({kAccountDataclassTidewater, kAccountDataclassLarder});

    flip(false);

    EXPECT_FALSE(isEnabled(kAccountDataclassTidewater));
    EXPECT_FALSE(isEnabled(kAccountDataclassLarder));
    EXPECT_EQ(savesUnderWay(), 1U);
    EXPECT_TRUE(platform.accountStore.given.front().enabled.empty()) << "both, before the save";
    EXPECT_EQ(calls(), Calls({"reload all parent rows"}));
}

TEST_F(MasterSwitchTest, TurningOffWithoutThePhotoStreamRefreshesOnlyTheParentRow) {
    openWith({kAccountDataclassTidewater});

    flip(false);

    EXPECT_EQ(calls(), Calls({"reload parent row"}));
}

TEST_F(MasterSwitchTest, TurningOnLeavesThePhotoStreamAsItIs) {
    openWith({});
    flip(true);
    EXPECT_FALSE(isEnabled(kAccountDataclassLarder));
    EXPECT_EQ(calls(), Calls({"reload parent row"}));

    openWith({kAccountDataclassLarder});
    pane->_reloadVantrelAccount();
    flip(true);
    EXPECT_TRUE(isEnabled(kAccountDataclassLarder));
}

TEST_F(MasterSwitchTest, OtherDataClassesAreNotTouched) {
    const std::set<Dataclass> others{kAccountDataclassKeyValue,
                                     Dataclass("kAccountDataclassTSYDatabaseService"),
                                     Dataclass("kAccountDataclassTSYDeviceService"),
                                     Dataclass("kAccountDataclassTSYShareService")};
    std::set<Dataclass> all = others;
    all.insert({kAccountDataclassTidewater, kAccountDataclassLarder});
    openWith(all);

    flip(false);

    EXPECT_EQ(std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount())->flags.enabled,
              others);
}

TEST_F(MasterSwitchTest, TheParentIsRefreshedBeforeTheSaveEnds) {
    openWith({});

    flip(true);

    EXPECT_EQ(savesUnderWay(), 1U);
    EXPECT_EQ(calls(), Calls({"reload parent row"}));
}

TEST_F(MasterSwitchTest, TheSaveIsAskedForBeforeTheParentIsRefreshed) {
    openWith({});
    std::size_t callsBefore = 1;
    platform.accountStore.whenGiven = [&] { callsBefore = calls().size(); };

    flip(true);

    EXPECT_EQ(callsBefore, 0U);
}

TEST_F(MasterSwitchTest, ASuccessfulSaveShowsTheRowsThenEndsTheBusyIndicator) {
    openWith({});
    flip(true);
    platform.calls.clear();

    platform.accountStore.endSave({});
    EXPECT_EQ(calls(), Calls({"busy: Turning on"}));
    pumpMain();

    EXPECT_EQ(calls(),
              Calls({"busy: Turning on", "begin",
                     "insert RSPStatusInfo after Nimbra Drive, animated", "end", "not busy"}));
}

TEST_F(MasterSwitchTest, TheBusyMessageSaysWhichWayTheSwitchGoes) {
    openWith({kAccountDataclassTidewater});
    flip(false);
    platform.calls.clear();

    platform.accountStore.endSave({});

    EXPECT_EQ(calls(), Calls({"busy: Turning off"}));
}

TEST_F(MasterSwitchTest, TheBusyMessageIsOfTheAccountBeingSaved) {
    openWith({});
    flip(true);
    platform.calls.clear();
    pane->_reloadVantrelAccount();
    ASSERT_FALSE(isEnabled(kAccountDataclassTidewater));

    platform.accountStore.endSave({});

    EXPECT_EQ(calls(), Calls({"busy: Turning on"}));
}

TEST_F(MasterSwitchTest, AFailedSaveDrawsTheSwitchInItsStoredStateThenEndsTheBusyIndicator) {
    fillAllRows();
    openWith({kAccountDataclassTidewater, kAccountDataclassLarder});
    const std::string before = rows();
    flip(false);
    platform.calls.clear();

    platform.accountStore.endSave(std::unexpected(kRefused));
    pumpMain();

    EXPECT_EQ(calls(),
              Calls({"busy: Turning off", "reload row Nimbra Drive, animated", "not busy"}));
    EXPECT_EQ(master()->value(), RowValue(true));
    EXPECT_TRUE(isEnabled(kAccountDataclassLarder));
    EXPECT_EQ(rows(), before);
}

TEST_F(MasterSwitchTest, AFailedSaveReadsTheAccountAnewOnTheCallingQueue) {
    openWith({});
    flip(true);
    ASSERT_EQ(platform.accountStore.asked, Calls({"primary"}));
    std::vector<std::size_t> askedBefore;
    platform.workQueues.mainQueue().whenQueued = [&] {
        askedBefore.push_back(platform.accountStore.asked.size());
    };

    platform.accountStore.endSave(std::unexpected(kRefused));

    EXPECT_EQ(askedBefore, (std::vector<std::size_t>{2, 2})) << "before the row is asked for";
    // The main queue has not run yet.
    EXPECT_EQ(platform.accountStore.asked, Calls({"primary", "primary"}));
    EXPECT_FALSE(isEnabled(kAccountDataclassTidewater));
}

TEST_F(MasterSwitchTest, AFailedSaveIsNeitherLoggedNorShownByThePane) {
    openWith({});
    flip(true);

    platform.accountStore.endSave(std::unexpected(kRefused));
    pumpMain();

    EXPECT_EQ(platform.systemLog.lines, FakeSystemLog::Lines());
    EXPECT_TRUE(syslog.lines.empty());
}

TEST_F(MasterSwitchTest, ASuccessfulSaveDoesNotReadTheAccountAgain) {
    openWith({});
    flip(true);

    platform.accountStore.endSave({});
    pumpMain();

    EXPECT_EQ(platform.accountStore.asked, Calls({"primary"}));
}

TEST_F(MasterSwitchTest, InFirstSetupTheFlagChangesAndNothingIsSavedOrShown) {
    const auto account = std::make_shared<FakeAccount>("new");
    account->flags.enabled = {kAccountDataclassTidewater, kAccountDataclassLarder};
    entry->setUserInfo({{FirstSetupKey, true}, {AccountKey, std::shared_ptr<Account>(account)}});
    static_cast<void>(pane->specifiers());
    const std::string before = rows();

    flip(false);
    pumpMain();

    EXPECT_FALSE(account->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_FALSE(account->isEnabledForDataclass(kAccountDataclassLarder));
    EXPECT_EQ(savesUnderWay(), 0U);
    EXPECT_EQ(calls(), Calls({"reload all parent rows"}));
    EXPECT_EQ(rows(), before);
}

TEST_F(MasterSwitchTest, APaneThatClosesDuringASaveStillEndsTheBusyIndicator) {
    openWith({});
    flip(true);
    const auto& save = platform.accountStore.saves.front();
    save.end({});
    platform.calls.clear();

    pane.reset();
    pumpMain();

    EXPECT_EQ(calls().back(), "not busy");
}

TEST_F(MasterSwitchTest, WithoutAnAccountAFlipDoesNothing) {
    platform.accountStore.isReadable = false;
    static_cast<void>(pane->specifiers());

    flip(true);

    EXPECT_EQ(savesUnderWay(), 0U);
    EXPECT_EQ(calls(), Calls());
}

TEST_F(MasterSwitchTest, AFailedSaveAfterARebuildDrawsTheSwitchThatIsShown) {
    openWith({});
    pane->reloadSpecifiers();
    flip(true);
    platform.calls.clear();

    platform.accountStore.endSave(std::unexpected(kRefused));
    pumpMain();

    EXPECT_EQ(calls(),
              Calls({"busy: Turning on", "reload row Nimbra Drive, animated", "not busy"}));
}

TEST_F(MasterSwitchTest, AFailedSaveReadsTheAccountBeforeItQueuesAnything) {
    openWith({});
    flip(true);
    PumpedQueue& mainQueue = platform.workQueues.mainQueue();
    std::vector<std::size_t> queuedAtReading;
    platform.accountStore.onAsked = [&] { queuedAtReading.push_back(mainQueue.pendingCount()); };

    platform.accountStore.endSave(std::unexpected(kRefused));

    EXPECT_EQ(queuedAtReading, std::vector<std::size_t>{0});
    EXPECT_EQ(mainQueue.pendingCount(), 2U);
}

TEST_F(MasterSwitchTest, TheEndOfAFailedSaveIsShownOnTheMainQueueOnly) {
    openWith({kAccountDataclassTidewater});
    flip(false);
    platform.calls.clear();

    platform.accountStore.endSave(std::unexpected(kRefused));

    EXPECT_EQ(calls(), Calls({"busy: Turning off"}));
}

TEST_F(MasterSwitchTest, TurningOffWhatIsOffLeavesThePhotoStreamAsItIs) {
    openWith({kAccountDataclassLarder});
    const auto account = std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount());

    flip(false);

    EXPECT_EQ(account->changes, Calls());
    EXPECT_EQ(savesUnderWay(), 0U);
    EXPECT_EQ(calls(), Calls());
}

TEST_F(MasterSwitchTest, InFirstSetupTurningOnIsNotSavedEither) {
    const auto account = std::make_shared<FakeAccount>("new");
    entry->setUserInfo({{FirstSetupKey, true}, {AccountKey, std::shared_ptr<Account>(account)}});
    static_cast<void>(pane->specifiers());

    flip(true);
    pumpMain();

    EXPECT_EQ(account->changes, Calls({"enable kAccountDataclassTidewater"}));
    EXPECT_EQ(savesUnderWay(), 0U);
    EXPECT_EQ(calls(), Calls({"reload parent row"}));
}

} // namespace
} // namespace nimbra::test
