#include "tests/pane/DiagnosticsFixture.h"

#include <gmock/gmock.h>

namespace nimbra::test {
namespace {

using testing::ElementsAre;

struct DiagnosticRows : DiagnosticsFixture {};

TEST_F(DiagnosticRows, ALogLevelOfSevenShowsThemAtTheEnd) {
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPDiagnostics "
                      "CLOUD_DRIVE_DIAGNOSE");
    const auto group = pane->specifiers().at(3);
    EXPECT_EQ(group->cellType(), GroupCell);
    EXPECT_EQ(group->propertyForKey(FooterTextGroupKey), RowValue("Finds faults."));
}

TEST_F(DiagnosticRows, EveryOtherLogLevelHidesThem) {
    for (const std::int64_t level : {6, 8, 0, -7, 1'000'000}) {
        setLogLevel(level);
        pane->reloadSpecifiers();
        EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo") << level;
    }
}

TEST_F(DiagnosticRows, WithoutALogLevelThereAreNone) {
    platform.preferences.integers.clear();
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");

    // Neither another domain nor another key counts.
    platform.preferences.integers = {{{"com.vantrel.other", "log.level"}, 7},
                                     {{"com.vantrel.marrow", "log_level"}, 7}};
    pane->reloadSpecifiers();
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(DiagnosticRows, TheButtonIsAPlainOne) {
    EXPECT_EQ(button()->cellType(), ButtonCell);
    EXPECT_EQ(button()->name(), Text("Diagnose"));
    EXPECT_EQ(button()->identifier(), Text("CLOUD_DRIVE_DIAGNOSE"));
    EXPECT_EQ(button()->target(), pane.get());
    EXPECT_FALSE(button()->hasSetter());
    EXPECT_EQ(button()->value(), RowValue());
    EXPECT_EQ(button()->detailControllerClass(), nullptr);
    EXPECT_TRUE(button()->hasButtonAction());
}

TEST_F(DiagnosticRows, TextsAreLookedUpInTheOrderInWhichTheyAreSeen) {
    const auto missing = [](const char* key) {
        return std::pair(3, std::string("Could not find localized string value for key: ") + key);
    };
    const auto texts = std::exchange(platform.bundles.paneBundle,
                                     std::make_shared<FakeBundle>(std::map<std::string, Text>()));
    ASSERT_TRUE(pane->_createSpecifiersForDiagnostics());
    EXPECT_THAT(syslog.lines,
                ElementsAre(missing("CLOUD_DRIVE_DIAGNOSE_TEXT"), missing("CLOUD_DRIVE_DIAGNOSE")));

    platform.bundles.paneBundle = texts;
    ASSERT_EQ(pane->specifiers().size(), 5U);
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(std::map<std::string, Text>());
    syslog.lines.clear();
    platform.processes.status = 0x0100;
    tapAndWait();

    EXPECT_THAT(syslog.lines, ElementsAre(missing("CLOUD_DRIVE_DIAGNOSE_GATHER"),
                                          missing("CLOUD_DRIVE_DIAGNOSE_ERROR"),
                                          missing("CLOUD_DRIVE_DIAGNOSE_ERROR_TEXT"),
                                          missing("CLOUD_DRIVE_DIAGNOSE_ERROR_OK")));
}

TEST_F(DiagnosticRows, ABusyPageLooksUpNoText) {
    tap();
    const int lookups = platform.bundles.lookups;

    tap();

    EXPECT_EQ(platform.bundles.lookups, lookups);
}

TEST_F(DiagnosticRows, OfAllPreferencesOnlyTheLogLevelIsReadAndOnlyForAList) {
    static_cast<void>(rows());
    pane->viewDidAppear(true);
    pane->specifiers().at(1)->setValue(false);
    platform.accountStore.endSave({});
    pumpMain();

    EXPECT_THAT(platform.preferences.reads, ElementsAre(std::pair(std::string("com.vantrel.marrow"),
                                                                  std::string("log.level"))));
}

TEST_F(DiagnosticRows, EachListHasRowsOfItsOwn) {
    const auto first = pane->_createSpecifiersForDiagnostics();
    const auto second = pane->_createSpecifiersForDiagnostics();

    ASSERT_TRUE(first && second);
    ASSERT_EQ(first->size(), 2U);
    ASSERT_EQ(second->size(), 2U);
    EXPECT_NE(first->at(0), second->at(0));
    EXPECT_NE(first->at(1), second->at(1));
}

} // namespace
} // namespace nimbra::test
