#include "tests/pane/PaneFixture.h"

#include <cstdint>
#include <gmock/gmock.h>
#include <limits>
#include <map>
#include <memory>
#include <string>
#include <utility>

namespace nimbra::test {
namespace {

using testing::ElementsAre;

constexpr const char* withRow = "RSPNimbraDrive Nimbra Drive RSPLookMeUpByEmail Look me up";
constexpr const char* withoutRow = "RSPNimbraDrive Nimbra Drive";
const FakeSystemLog::Lines kLoading{
    {LogLevel::standard, "Tessary settings bundle not loaded. Loading..."}};

/// A primary account that is provisioned for the cloud database, and a device with its settings.
struct TessaryRow : PaneFixture {
    TessaryRow() {
        pane->makesTessaryRow = true;
        stored().isPrimary = true;
        stored().provisioned = {kAccountDataclassTSYDatabaseService};
        stored().tessaryAccount = "database";
        platform.bundles.bundleAtPath = std::make_shared<FakeBundle>(std::nullopt);
        bundle().loaded = false;
        bundle().onLoad = [this] { return platform.classes.registerClass(controllerClass()); };
    }

    [[nodiscard]] FakeAccount::Flags& stored() { return platform.accountStore.stored; }
    [[nodiscard]] FakeBundle& bundle() { return *platform.bundles.bundleAtPath; }
    [[nodiscard]] std::shared_ptr<Specifier> tessary() const { return pane->specifiers().at(3); }
    [[nodiscard]] const FakeSystemLog::Lines& lines() const { return platform.systemLog.lines; }

    /// What the row shows when the class answers with `number`.
    [[nodiscard]] RowValue shownFor(const RowValue& number) {
        answer = number;
        return tessary()->value();
    }

    /// What the class operation gives.
    RowValue answer = std::int64_t{3};
    /// How often it was asked.
    int asked = 0;

private:
    [[nodiscard]] ControllerClass controllerClass() {
        return {.name = "TSYSettingsController",
                .classOperations = {{"tessaryNumAppGroups", [this] {
                                         ++asked;
                                         return answer;
                                     }}}};
    }
};

TEST_F(TessaryRow, IsALinkToTheClassOfTheBundle) {
    EXPECT_EQ(rows(), withRow);
    EXPECT_EQ(tessary()->cellType(), LinkListCell);
    EXPECT_EQ(tessary()->name(), Text("Look me up"));
    EXPECT_EQ(tessary()->identifier(), Text());
    EXPECT_EQ(tessary()->target(), pane.get());
    EXPECT_FALSE(tessary()->hasSetter());
    EXPECT_FALSE(tessary()->hasButtonAction());
    EXPECT_NE(tessary()->detailControllerClass(), nullptr);
    EXPECT_EQ(tessary()->detailControllerClass(),
              platform.classes.classNamed("TSYSettingsController"));
    EXPECT_EQ(tessary()->value(), RowValue("3 apps"));
}

TEST_F(TessaryRow, IsNotThereForASecondaryAccountAndNothingIsLoaded) {
    stored().isPrimary = false;

    EXPECT_EQ(rows(), withoutRow);
    EXPECT_TRUE(lines().empty());
    EXPECT_TRUE(platform.bundles.pathsAskedFor.empty());
}

TEST_F(TessaryRow, IsNotThereForAnAccountThatIsNotProvisionedAndNothingIsLoaded) {
    stored().provisioned = {kAccountDataclassTidewater, kAccountDataclassTSYShareService};
    stored().enabled = {kAccountDataclassTSYDatabaseService};

    EXPECT_EQ(rows(), withoutRow);
    EXPECT_TRUE(lines().empty());
    EXPECT_TRUE(platform.bundles.pathsAskedFor.empty());
}

TEST_F(TessaryRow, IsNotThereWithoutAnAccount) {
    platform.accountStore.isReadable = false;
    pane->upgrade = nullptr;

    EXPECT_EQ(rows(), withoutRow);
    EXPECT_TRUE(platform.bundles.pathsAskedFor.empty());
}

TEST_F(TessaryRow, IsThereForADataClassThatIsProvisionedButSwitchedOff) {
    stored().enabled.clear();

    EXPECT_EQ(rows(), withRow);
}

TEST_F(TessaryRow, LoadsTheBundleOnceFromItsPlaceBelowTheSystemsRoot) {
    static_cast<void>(rows());
    EXPECT_THAT(platform.bundles.pathsAskedFor,
                ElementsAre("/System/Library/PreferenceBundles/AccountSettings/"
                            "TessarySettings.bundle"));
    EXPECT_EQ(bundle().loads, 1);
    EXPECT_EQ(lines(), kLoading);

    pane->reloadSpecifiers();

    EXPECT_EQ(rows(), withRow);
    EXPECT_EQ(bundle().loads, 1);
    EXPECT_EQ(lines(), kLoading);
}

TEST_F(TessaryRow, FindsTheBundleBelowAnotherRoot) {
    platform.fileManager.root = "/mnt/system";

    static_cast<void>(rows());

    EXPECT_THAT(platform.bundles.pathsAskedFor,
                ElementsAre("/mnt/system/System/Library/PreferenceBundles/AccountSettings/"
                            "TessarySettings.bundle"));
}

TEST_F(TessaryRow, LogsBeforeItLoads) {
    bundle().onLoad = [this] {
        EXPECT_EQ(lines(), kLoading);
        return true;
    };

    static_cast<void>(rows());

    EXPECT_EQ(bundle().loads, 1);
}

TEST_F(TessaryRow, WithoutTheBundleIsEmptyAndLogsAtEveryRebuild) {
    platform.bundles.bundleAtPath = nullptr;

    EXPECT_EQ(rows(), withRow);
    EXPECT_EQ(tessary()->detailControllerClass(), nullptr);
    EXPECT_EQ(tessary()->value(), RowValue(""));
    EXPECT_EQ(lines(), kLoading);

    pane->reloadSpecifiers();
    pane->reloadSpecifiers();

    EXPECT_EQ(lines().size(), 3U);
    EXPECT_EQ(lines().back(), kLoading.front());
}

TEST_F(TessaryRow, WithABundleThatCannotBeLoadedIsEmptyAndTriesAtEveryRebuild) {
    bundle().onLoad = [] { return false; };

    EXPECT_EQ(rows(), withRow);
    pane->reloadSpecifiers();

    EXPECT_EQ(tessary()->detailControllerClass(), nullptr);
    EXPECT_EQ(tessary()->value(), RowValue(""));
    EXPECT_EQ(bundle().loads, 2);
    EXPECT_EQ(lines().size(), 2U);
}

TEST_F(TessaryRow, WithABundleThatLacksTheClassIsEmpty) {
    bundle().onLoad = [this] { return platform.classes.registerClass({.name = "Other"}); };

    EXPECT_EQ(rows(), withRow);
    EXPECT_EQ(tessary()->detailControllerClass(), nullptr);
    EXPECT_EQ(tessary()->value(), RowValue(""));
    EXPECT_NE(tessary()->userInfo(), UserInfo());
}

TEST_F(TessaryRow, WithAClassThatLacksTheOperationIsEmptyButLeadsThere) {
    bundle().onLoad = [this] {
        return platform.classes.registerClass({.name = "TSYSettingsController"});
    };

    EXPECT_NE(tessary()->detailControllerClass(), nullptr);
    EXPECT_EQ(tessary()->value(), RowValue(""));
}

TEST_F(TessaryRow, AsksForTheNumberEachTimeAndLoadsNothingForIt) {
    const auto row = tessary();
    EXPECT_EQ(asked, 0);
    EXPECT_EQ(shownFor(std::int64_t{1}), RowValue("1 apps"));
    EXPECT_EQ(shownFor(std::int64_t{2}), RowValue("2 apps"));

    EXPECT_EQ(asked, 2);
    EXPECT_EQ(tessary(), row);
    EXPECT_EQ(bundle().loads, 1);
    EXPECT_EQ(platform.bundles.pathsAskedFor.size(), 1U);
}

TEST_F(TessaryRow, ShowsNothingForLessThanOne) {
    EXPECT_EQ(shownFor(std::int64_t{0}), RowValue(""));
    EXPECT_EQ(shownFor(std::int64_t{-1}), RowValue(""));
    EXPECT_EQ(shownFor(std::numeric_limits<std::int64_t>::min()), RowValue(""));
}

TEST_F(TessaryRow, ShowsNothingForWhatIsNoNumber) {
    EXPECT_EQ(shownFor(RowValue()), RowValue(""));
    EXPECT_EQ(shownFor(Text("3")), RowValue(""));
}

TEST_F(TessaryRow, ShowsTheLower32BitsOfALargeNumber) {
    EXPECT_EQ(shownFor(std::int64_t{2147483647}), RowValue("2147483647 apps"));
    EXPECT_EQ(shownFor(std::int64_t{2147483648}), RowValue("-2147483648 apps"));
    EXPECT_EQ(shownFor(std::int64_t{4294967296}), RowValue("0 apps"));
    EXPECT_EQ(shownFor(std::int64_t{4294967301}), RowValue("5 apps"));
}

TEST_F(TessaryRow, ShowsNoTextWhereThePagesBundleIsNotFound) {
    platform.bundles.paneBundle = nullptr;

    EXPECT_EQ(tessary()->value(), RowValue(Text()));
}

TEST_F(TessaryRow, CarriesACopyOfThePagesUserInfoWithTheDatabasesAccount) {
    const UserInfo before{{AccountIdentifierKey, Text("primary")},
                          {FirstSetupKey, false},
                          {AccountKey, std::shared_ptr<Account>()}};
    entry->setUserInfo(before);

    UserInfo carried = tessary()->userInfo();

    EXPECT_EQ(userInfoValue<Text>(carried, AccountIdentifierKey), Text("primary"));
    EXPECT_EQ(carried.count(FirstSetupKey), 1U);
    const auto account = userInfoValue<std::shared_ptr<Account>>(carried, AccountKey);
    ASSERT_NE(account, nullptr);
    EXPECT_EQ(account->identifier(), AccountIdentifier("database"));

    carried.clear();
    tessary()->setUserInfo(carried);
    EXPECT_EQ(entry->userInfo(), before);
}

TEST_F(TessaryRow, CarriesNothingWithoutAnAccountOfTheDatabase) {
    stored().tessaryAccount.clear();

    EXPECT_EQ(rows(), withRow);
    EXPECT_EQ(tessary()->userInfo(), UserInfo());
    EXPECT_EQ(tessary()->value(), RowValue("3 apps"));
}

TEST_F(TessaryRow, CarriesTheUserInfoOfTheTimeWhenItWasBuilt) {
    ASSERT_EQ(rows(), withRow);
    const UserInfoKey later("later");
    entry->setUserInfo({{AccountIdentifierKey, Text("primary")}, {later, true}});
    EXPECT_EQ(tessary()->userInfo().count(later), 0U);

    pane->reloadSpecifiers();

    EXPECT_EQ(tessary()->userInfo().count(later), 1U);
}

TEST_F(TessaryRow, HasANewGroupWithEachList) {
    const SpecifierArray earlier = pane->specifiers();
    pane->reloadSpecifiers();

    EXPECT_NE(pane->specifiers().at(2), earlier.at(2));
    EXPECT_NE(tessary(), earlier.at(3));
}

TEST_F(TessaryRow, LoadsTheBundleWhereverTheClassIsFrom) {
    ASSERT_TRUE(bundle().onLoad());
    platform.bundles.bundleAtPath.reset();

    EXPECT_EQ(rows(), withRow);
    pane->reloadSpecifiers();

    // A class of that name is no sign that the bundle is loaded.
    EXPECT_EQ(lines(), (FakeSystemLog::Lines{kLoading.front(), kLoading.front()}));
    EXPECT_NE(tessary()->detailControllerClass(), nullptr);
}

TEST_F(TessaryRow, LoadsABundleWithoutTheClassOnce) {
    bundle().onLoad = [] { return true; };
    ASSERT_EQ(rows(), withRow);
    pane->reloadSpecifiers();
    pane->reloadSpecifiers();

    EXPECT_EQ(lines(), kLoading);
    EXPECT_EQ(bundle().loads, 1);
}

TEST_F(TessaryRow, LoadsTheBundleWhereTheLogKeepsNothing) {
    platform.systemLog.enabled.clear();

    EXPECT_EQ(rows(), withRow);

    EXPECT_TRUE(lines().empty());
    EXPECT_EQ(bundle().loads, 1);
    EXPECT_EQ(tessary()->value(), RowValue("3 apps"));
}

TEST_F(TessaryRow, FindsTheClassEachTimeItsValueIsAskedFor) {
    const auto registers = bundle().onLoad;
    platform.bundles.bundleAtPath.reset();
    const auto row = tessary();
    EXPECT_EQ(row->value(), RowValue(""));

    ASSERT_TRUE(registers());

    EXPECT_EQ(row->value(), RowValue("3 apps"));
    EXPECT_EQ(row->detailControllerClass(), nullptr);
}

TEST_F(TessaryRow, FindsThePagesBundleEachTimeItsValueIsAskedFor) {
    const auto row = tessary();
    const auto texts = std::exchange(platform.bundles.paneBundle, nullptr);
    EXPECT_EQ(row->value(), RowValue(Text()));

    platform.bundles.paneBundle = texts;

    EXPECT_EQ(row->value(), RowValue("3 apps"));
}

TEST_F(TessaryRow, LooksUpNoTextForLessThanOne) {
    const auto row = tessary();
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(std::map<std::string, Text>());
    answer = std::int64_t{0};

    EXPECT_EQ(row->value(), RowValue(""));

    EXPECT_TRUE(syslog.lines.empty());
}

TEST_F(TessaryRow, WithAnOperationThatIsNotThereIsEmpty) {
    bundle().onLoad = [this] {
        return platform.classes.registerClass(
            {.name = "TSYSettingsController", .classOperations = {{"tessaryNumAppGroups", {}}}});
    };

    EXPECT_EQ(tessary()->value(), RowValue(""));
}

TEST_F(TessaryRow, StandsBehindTheStatusWhileTheSwitchIsOn) {
    storeTidewater(true);

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPLookMeUpByEmail Look me up");
}

} // namespace
} // namespace nimbra::test
