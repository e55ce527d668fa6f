#include "tests/pane/PaneFixture.h"

namespace nimbra::test {
namespace {

struct DependentRowsTest : PaneFixture {
    void flip(bool on) {
        pane->turn(on);
        pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();
    }
};

TEST_F(DependentRowsTest, TurningOnShowsTheRowsInOneAnimatedBatch) {
    storeTidewater(false);
    fillAllRows();
    static_cast<void>(pane->specifiers());

    flip(true);

    EXPECT_EQ(platform.calls, Calls({"begin", "insert RSPStatusInfo after Nimbra Drive, animated",
                                     "append RSPUIApps Alpha Zeta, animated",
                                     "append RSPCellular Cellular, animated",
                                     "append RSPDiagnostics D, animated", "end"}));
}

TEST_F(DependentRowsTest, TurningOnGivesTheOrderOfAFreshBuild) {
    storeTidewater(false);
    fillAllRows();
    static_cast<void>(pane->specifiers());

    flip(true);
    const std::string afterFlip = rows();
    pane->reloadSpecifiers();

    EXPECT_EQ(afterFlip, rows());
}

TEST_F(DependentRowsTest, ASecondCallWithTheSwitchOnChangesNothing) {
    storeTidewater(false);
    fillAllRows();
    static_cast<void>(pane->specifiers());
    flip(true);
    platform.calls.clear();

    pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();

    EXPECT_EQ(platform.calls, Calls());
}

TEST_F(DependentRowsTest, TurningOffRemovesTheRowsInOneAnimatedBatch) {
    storeTidewater(true);
    fillAllRows();
    static_cast<void>(pane->specifiers());

    flip(false);

    EXPECT_EQ(platform.calls, Calls({"begin", "remove RSPDiagnostics D, animated",
                                     "remove RSPCellular Cellular, animated",
                                     "remove RSPUIApps Alpha Zeta, animated",
                                     "remove RSPStatusInfo, animated", "end"}));
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPLookMeUpByEmail T");
}

TEST_F(DependentRowsTest, BeforeAnyListThereIsNothingToPutRowsInto) {
    storeTidewater(true);
    fillAllRows();

    pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();

    EXPECT_EQ(platform.calls, Calls({"begin", "end"}));
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPLookMeUpByEmail T RSPUIApps "
                      "Alpha Zeta RSPCellular Cellular RSPDiagnostics D");
}

TEST_F(DependentRowsTest, TurningOffTwiceFindsNothingToRemove) {
    storeTidewater(true);
    fillAllRows();
    static_cast<void>(pane->specifiers());
    flip(false);
    platform.calls.clear();

    pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();

    EXPECT_EQ(platform.calls, Calls({"begin", "end"}));
}

TEST_F(DependentRowsTest, AFlipMovesTheRowsThatAreThereAndAsksForNoApps) {
    storeTidewater(true);
    fillAllRows();
    static_cast<void>(pane->specifiers());
    const SpecifierArray before = pane->specifiers();

    flip(false);
    flip(true);

    EXPECT_EQ(pane->specifiers(), before);
    EXPECT_EQ(pane->appQueries, 1);
}

TEST_F(DependentRowsTest, WithoutRowsAroundItOnlyTheStatusGroupComesAndGoes) {
    storeTidewater(false);
    static_cast<void>(pane->specifiers());

    flip(true);
    flip(false);

    EXPECT_EQ(platform.calls, Calls({"begin", "insert RSPStatusInfo after Nimbra Drive, animated",
                                     "end", "begin", "remove RSPStatusInfo, animated", "end"}));
}

TEST_F(DependentRowsTest, BeforeTheListIsBuiltThereIsNothingToHide) {
    storeTidewater(false);

    pane->_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();

    EXPECT_EQ(platform.calls, Calls());
}

TEST_F(DependentRowsTest, AfterARebuildTheRowsOfTheNewListComeAndGo) {
    storeTidewater(false);
    fillAllRows();
    static_cast<void>(pane->specifiers());
    pane->apps = {row("Beta")};
    platform.deviceInfo.hasCellularData = false;
    pane->diagnostics = SpecifierArray{Specifier::groupSpecifierWithID("RSPLogs"), row("E")};
    pane->reloadSpecifiers();
    platform.calls.clear();

    flip(true);
    EXPECT_EQ(platform.calls,
              Calls({"begin", "insert RSPStatusInfo after Nimbra Drive, animated",
                     "append RSPUIApps Beta, animated", "append RSPLogs E, animated", "end"}));
    platform.calls.clear();

    flip(false);
    EXPECT_EQ(platform.calls,
              Calls({"begin", "remove RSPLogs E, animated", "remove RSPUIApps Beta, animated",
                     "remove RSPStatusInfo, animated", "end"}));
}

TEST_F(DependentRowsTest, ARebuildWithoutAppsForgetsTheEarlierOnes) {
    storeTidewater(false);
    fillAllRows();
    static_cast<void>(pane->specifiers());
    pane->apps = SpecifierArray();
    pane->reloadSpecifiers();
    platform.calls.clear();

    flip(true);

    EXPECT_EQ(platform.calls, Calls({"begin", "insert RSPStatusInfo after Nimbra Drive, animated",
                                     "append RSPCellular Cellular, animated",
                                     "append RSPDiagnostics D, animated", "end"}));
}

} // namespace
} // namespace nimbra::test
