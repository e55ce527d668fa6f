#include "tests/pane/PaneFixture.h"

namespace nimbra::test {
namespace {

const Error kRefused{"store", 7, "refused"};

struct CellularRowsTest : PaneFixture {
    CellularRowsTest() {
        storeTidewater(true);
        platform.deviceInfo.hasCellularData = true;
    }

    /// The group and the switch, which stand at the end of the list.
    [[nodiscard]] std::shared_ptr<Specifier> group() const { return pane->specifiers().at(3); }
    [[nodiscard]] std::shared_ptr<Specifier> cellular() const { return pane->specifiers().at(4); }
    [[nodiscard]] bool usesCellular(const Dataclass& dataclass) const {
        return pane->_vantrelAccount()->vt_useCellularForDataclass(dataclass);
    }
    [[nodiscard]] std::set<Dataclass>& stored() { return platform.accountStore.stored.cellular; }
    [[nodiscard]] const Calls& calls() const { return platform.calls; }
    void pumpMain() { platform.workQueues.mainQueue().pump(); }
};

TEST_F(CellularRowsTest, ADeviceWithCellularDataHasTheGroupAndTheSwitch) {
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPCellular Cellular");
    EXPECT_EQ(group()->propertyForKey(FooterTextGroupKey), RowValue("Over Wi-Fi."));
    EXPECT_EQ(cellular()->cellType(), SwitchCell);
    EXPECT_EQ(cellular()->identifier(), Text());
    EXPECT_EQ(cellular()->target(), pane.get());
    EXPECT_EQ(cellular()->propertyForKey(EnabledKey), RowValue(true));
}

TEST_F(CellularRowsTest, ADeviceWithoutCellularDataHasNeither) {
    platform.deviceInfo.hasCellularData = false;

    EXPECT_EQ(pane->_createSpecifiersForCellularSwitchCell(), std::nullopt);
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(CellularRowsTest, TheFooterHasTheDevicesWordingOfWirelessNetworks) {
    platform.deviceInfo.variant = "WLAN";

    EXPECT_EQ(group()->propertyForKey(FooterTextGroupKey), RowValue("Over WLAN."));
    EXPECT_EQ(cellular()->name(), Text("Cellular"));
}

TEST_F(CellularRowsTest, RestrictionsLockTheSwitchWhenTheListIsBuilt) {
    platform.restrictions.allowsCellularModification = false;
    EXPECT_FALSE(cellular()->isEnabled());

    platform.restrictions.allowsCellularModification = true;
    EXPECT_FALSE(cellular()->isEnabled());
    pane->reloadSpecifiers();
    EXPECT_TRUE(cellular()->isEnabled());
}

TEST_F(CellularRowsTest, TheSwitchIsOnOnlyWhenBothDataClassesMayUseCellular) {
    EXPECT_EQ(cellular()->value(), RowValue(false));

    pane->_vantrelAccount()->vt_setUseCellularForDataclass(true, kAccountDataclassTidewater);
    EXPECT_EQ(cellular()->value(), RowValue(false));

    pane->_vantrelAccount()->vt_setUseCellularForDataclass(true, kAccountDataclassKeyValue);
    EXPECT_EQ(cellular()->value(), RowValue(true));

    pane->_vantrelAccount()->vt_setUseCellularForDataclass(false, kAccountDataclassTidewater);
    EXPECT_EQ(cellular()->value(), RowValue(false));
}

TEST_F(CellularRowsTest, TheSecondDataClassIsReadOnlyWhenTheFirstMayUseCellular) {
    const auto account = std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount());
    static_cast<void>(cellular()->value());
    EXPECT_EQ(account->cellularReads, std::vector({kAccountDataclassTidewater}));

    account->vt_setUseCellularForDataclass(true, kAccountDataclassTidewater);
    account->cellularReads.clear();
    static_cast<void>(cellular()->value());
    EXPECT_EQ(account->cellularReads,
              std::vector({kAccountDataclassTidewater, kAccountDataclassKeyValue}));
}

TEST_F(CellularRowsTest, ADifferenceReadsAsOffAndTurningOnWritesBoth) {
    stored() = {kAccountDataclassTidewater};
    ASSERT_EQ(cellular()->value(), RowValue(false));

    cellular()->setValue(true);

    EXPECT_EQ(std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount())->cellularWrites,
              Calls({"allow kAccountDataclassTidewater", "allow kAccountDataclassKeyValue"}));
    EXPECT_TRUE(usesCellular(kAccountDataclassTidewater));
    EXPECT_TRUE(usesCellular(kAccountDataclassKeyValue));
    ASSERT_EQ(platform.accountStore.saves.size(), 1U);
    EXPECT_EQ(platform.accountStore.saves.front().operation, "saveVerifiedAccount");
    EXPECT_EQ(platform.accountStore.given.front().cellular.size(), 2U) << "both, before the save";
}

TEST_F(CellularRowsTest, ASetValueIsSavedEvenWhenItIsTheStoredOne) {
    stored() = {kAccountDataclassTidewater, kAccountDataclassKeyValue};

    cellular()->setValue(true);

    EXPECT_EQ(platform.accountStore.saves.size(), 1U);
}

TEST_F(CellularRowsTest, ASuccessfulSaveWritesOneDebugLineAndChangesNothingElse) {
    cellular()->setValue(true);

    platform.accountStore.endSave({});
    pumpMain();

    EXPECT_EQ(
        platform.systemLog.lines,
        FakeSystemLog::Lines(
            {{LogLevel::debug, "Successfully updated use-cellular flag on Nimbra account."}}));
    EXPECT_EQ(calls(), Calls());
    EXPECT_EQ(cellular()->value(), RowValue(true));
}

TEST_F(CellularRowsTest, AFailedSaveIsLoggedAndTheSwitchGoesBack) {
    stored() = {kAccountDataclassKeyValue};
    cellular()->setValue(true);

    platform.accountStore.endSave(std::unexpected(kRefused));
    EXPECT_EQ(calls(), Calls());
    EXPECT_FALSE(usesCellular(kAccountDataclassTidewater));
    EXPECT_TRUE(usesCellular(kAccountDataclassKeyValue));
    pumpMain();

    EXPECT_EQ(calls(), Calls({"reload row Cellular"}));
    EXPECT_EQ(cellular()->value(), RowValue(false));
    EXPECT_EQ(platform.systemLog.lines,
              FakeSystemLog::Lines({{LogLevel::error, "Error updating use-cellular flag on Nimbra "
                                                      "account: refused (store 7)"}}));
}

TEST_F(CellularRowsTest, AFailedSaveIsLoggedThenReloadsThenAsksForTheRow) {
    const auto account = std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount());
    cellular()->setValue(true);
    std::vector<int> reloads;
    const auto note = [&] { reloads.push_back(account->reloads); };
    platform.systemLog.onWrite = note;
    platform.workQueues.mainQueue().whenQueued = note;

    platform.accountStore.endSave(std::unexpected(kRefused));

    EXPECT_EQ(reloads, (std::vector{0, 1}));
}

TEST_F(CellularRowsTest, WithoutAnAccountASetValueIsNotSaved) {
    platform.accountStore.isReadable = false;

    pane->_createSpecifiersForCellularSwitchCell()->at(1)->setValue(true);

    EXPECT_TRUE(platform.accountStore.saves.empty());
}

TEST_F(CellularRowsTest, AFailedSaveReloadsTheSameAccountObject) {
    const auto account = pane->_vantrelAccount();
    cellular()->setValue(true);

    platform.accountStore.endSave(std::unexpected(kRefused));

    EXPECT_EQ(pane->_vantrelAccount(), account);
    EXPECT_EQ(std::static_pointer_cast<FakeAccount>(account)->reloads, 1);
    EXPECT_EQ(platform.accountStore.asked, Calls({"primary"}));
}

TEST_F(CellularRowsTest, InFirstSetupTheFlagsChangeAndNothingIsSavedOrLogged) {
    const auto account = std::make_shared<FakeAccount>("new");
    account->flags.enabled = {kAccountDataclassTidewater};
    entry->setUserInfo({{FirstSetupKey, true}, {AccountKey, std::shared_ptr<Account>(account)}});

    cellular()->setValue(true);
    pumpMain();

    EXPECT_TRUE(account->vt_useCellularForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(account->vt_useCellularForDataclass(kAccountDataclassKeyValue));
    EXPECT_TRUE(platform.accountStore.saves.empty());
    EXPECT_TRUE(platform.systemLog.lines.empty());
}

TEST_F(CellularRowsTest, TheSaveKeepsThePaneAndTheRowAliveUntilItHasEnded) {
    cellular()->setValue(true);
    const std::weak_ptr<PaneWithRows> watchedPane = pane;
    const std::weak_ptr<Specifier> watchedRow = cellular();
    pane->reloadSpecifiers();
    pane.reset();
    EXPECT_FALSE(watchedPane.expired());
    EXPECT_FALSE(watchedRow.expired());

    platform.accountStore.endSave({});

    EXPECT_TRUE(watchedPane.expired());
    EXPECT_TRUE(watchedRow.expired());
}

TEST_F(CellularRowsTest, WhetherTheDeviceHasCellularDataIsAskedWhenTheListIsBuilt) {
    ASSERT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPCellular Cellular");
    platform.deviceInfo.hasCellularData = false;

    for (const bool on : {false, true}) {
        pane->turn(on);
        pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();
    }
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPCellular Cellular");

    pane->reloadSpecifiers();
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(CellularRowsTest, TheSaveKeepsTheAccountThatItReloads) {
    const std::weak_ptr<FakeAccount> saved =
        std::static_pointer_cast<FakeAccount>(pane->_vantrelAccount());
    cellular()->setValue(true);
    auto& save = platform.accountStore.saves.front();

    save.account.reset();
    pane->_reloadVantrelAccount();
    ASSERT_FALSE(saved.expired());
    save.end(std::unexpected(kRefused));

    EXPECT_EQ(saved.lock()->reloads, 1);
    platform.accountStore.saves.clear();
    EXPECT_TRUE(saved.expired());
}

} // namespace
} // namespace nimbra::test
