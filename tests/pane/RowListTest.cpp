#include "tests/pane/PaneFixture.h"

namespace nimbra::test {
namespace {

struct RowListTest : PaneFixture {};

TEST_F(RowListTest, WithTheSwitchOffTheListIsTheGroupAndTheSwitch) {
    storeTidewater(false);

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive");
}

TEST_F(RowListTest, WithEveryConditionTrueTheListHasAllRowsInTheirOrder) {
    storeTidewater(true);
    platform.accountStore.stored.usesStratafile = false;
    fillAllRows();

    EXPECT_EQ(rows(), "U RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPLookMeUpByEmail T "
                      "RSPUIApps Alpha Zeta RSPCellular Cellular RSPDiagnostics D");
}

TEST_F(RowListTest, AnAccountOnTheOldServiceHasTheUpgradeRowFirstWhateverTheSwitch) {
    platform.accountStore.stored.usesStratafile = false;
    pane->upgrade = row("U");

    storeTidewater(false);
    EXPECT_EQ(rows(), "U RSPNimbraDrive Nimbra Drive");

    storeTidewater(true);
    pane->_reloadVantrelAccount();
    pane->reloadSpecifiers();
    EXPECT_EQ(rows(), "U RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(RowListTest, AnAccountOnTheNewServiceHasNoUpgradeRow) {
    pane->upgrade = row("U");

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive");
}

TEST_F(RowListTest, WithTheSwitchOffTheDatabaseRowFollowsTheSwitchDirectly) {
    storeTidewater(false);
    pane->tessary = row("T");

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPLookMeUpByEmail T");
}

TEST_F(RowListTest, AppsStandBehindTheirGroupByNameWithoutCaseAndWithNumbersByValue) {
    storeTidewater(true);
    pane->apps = {row("Zeta"), row("App 10"), row("app 2")};

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps app 2 App 10 Zeta");
}

TEST_F(RowListTest, AppsWithEqualNamesKeepTheOrderInWhichTheyCame) {
    storeTidewater(true);
    // More than a sort would keep in order by chance.
    constexpr int count = 40;
    pane->apps.emplace();
    std::string expected = "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps";
    for (int index = count; index > 0; --index) {
        const auto app = row(index % 2 == 0 ? "Notes" : "notes");
        app->setIdentifier("app-" + std::to_string(index));
        pane->apps->push_back(app);
        expected += " app-" + std::to_string(index);
    }

    EXPECT_EQ(rows(), expected);
}

TEST_F(RowListTest, WithoutAppsThereIsNoGroupOfApps) {
    storeTidewater(true);

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(RowListTest, AbsentRowSourcesContributeNothing) {
    storeTidewater(true);
    platform.deviceInfo.hasCellularData = false;
    pane->diagnostics = std::nullopt;

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(RowListTest, TheSourcesAreAskedInTheirOrderWhateverTheSwitch) {
    storeTidewater(false);
    platform.accountStore.stored.usesStratafile = false;
    platform.deviceInfo.whenAsked = [this] { pane->asked.emplace_back("cellular"); };

    static_cast<void>(pane->specifiers());

    EXPECT_EQ(pane->asked, Calls({"apps", "cellular", "diagnostics", "upgrade", "tessary"}));
}

TEST_F(RowListTest, TheListIsBuiltOnceAndKept) {
    storeTidewater(true);
    static_cast<void>(pane->specifiers());
    const auto master = pane->specifiers().at(1);

    EXPECT_EQ(pane->specifiers().at(1), master);
    EXPECT_EQ(pane->appQueries, 1);
}

TEST_F(RowListTest, AReloadBuildsEveryRowAnew) {
    static_cast<void>(pane->specifiers());
    const auto master = pane->specifiers().at(1);

    pane->reloadSpecifiers();

    EXPECT_NE(pane->specifiers().at(1), master);
    EXPECT_EQ(pane->appQueries, 2);
    EXPECT_EQ(platform.calls, Calls({"reload RSPNimbraDrive Nimbra Drive"}));
}

TEST_F(RowListTest, AppsAreAskedForWhateverTheSwitch) {
    storeTidewater(false);

    static_cast<void>(pane->specifiers());

    EXPECT_EQ(pane->appQueries, 1);
}

TEST_F(RowListTest, TheGroupsCarryTheirFooters) {
    storeTidewater(true);
    const SpecifierArray& list = pane->specifiers();

    EXPECT_EQ(list.at(0)->propertyForKey(FooterTextGroupKey), RowValue("Keeps your documents."));
    EXPECT_EQ(list.at(2)->propertyForKey(FooterCellClassGroupKey),
              RowValue("RSPNimbraDriveProgressFooterView"));
}

TEST_F(RowListTest, TheMasterSwitchShowsTheAccountsState) {
    storeTidewater(true);
    const auto master = pane->specifiers().at(1);
    EXPECT_EQ(master->cellType(), SwitchCell);
    EXPECT_EQ(master->target(), pane.get());
    EXPECT_EQ(master->identifier(), Text());
    EXPECT_EQ(master->detailControllerClass(), nullptr);
    EXPECT_EQ(master->value(), RowValue(true));

    pane->turn(false);

    EXPECT_EQ(master->value(), RowValue(false));
}

TEST_F(RowListTest, AMissingTextShowsTheStandInAndTheListIsBuiltAllTheSame) {
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(std::map<std::string, Text>());

    EXPECT_EQ(rows(), "RSPNimbraDrive RSP_LOCALIZED_STRING_UNAVAILABLE");
    ASSERT_EQ(syslog.lines.size(), 2U);
    EXPECT_TRUE(syslog.lines[0].second.ends_with(": CLOUD_DRIVE_EXPLANATION"));
    EXPECT_TRUE(syslog.lines[1].second.ends_with(": CLOUD_DRIVE"));
}

TEST_F(RowListTest, WithoutABundleTheTextsAreAbsentAndNothingIsReported) {
    platform.bundles.paneBundle = nullptr;

    const SpecifierArray& list = pane->specifiers();

    ASSERT_EQ(list.size(), 2U);
    EXPECT_EQ(list.at(1)->name(), Text());
    EXPECT_EQ(list.at(0)->propertyForKey(FooterTextGroupKey), RowValue(Text()));
    EXPECT_TRUE(syslog.lines.empty());
}

TEST_F(RowListTest, TheBundleIsLookedUpForEachText) {
    static_cast<void>(pane->specifiers());

    EXPECT_EQ(platform.bundles.lookups, 2);
}

TEST_F(RowListTest, AnAccountThatCannotBeReadShowsAsOffAndNotUpgraded) {
    platform.accountStore.isReadable = false;
    pane->upgrade = row("U");

    EXPECT_EQ(rows(), "U RSPNimbraDrive Nimbra Drive");
    EXPECT_EQ(pane->specifiers().at(2)->value(), RowValue(false));
}

TEST_F(RowListTest, AnAppWithoutANameComesFirstButBehindTheGroup) {
    storeTidewater(true);
    const auto unnamed = Specifier::preferenceSpecifierNamed(Text(), {.cell = SwitchCell});
    unnamed->setIdentifier("unnamed");
    pane->apps = {row("Alpha"), unnamed};

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps unnamed Alpha");
}

} // namespace
} // namespace nimbra::test
