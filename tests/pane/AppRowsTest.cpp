#include "tests/pane/AppRowsFixture.h"

namespace nimbra::test {
namespace {

constexpr const char* kHiddenEntitlement =
    "com.vantrel.private.vantrelaccount.app-hidden-from-nimbra-settings";

using AppRowsTest = AppRowsFixture;

TEST_F(AppRowsTest, WithoutRecordsThereAreNoRowsButACache) {
    EXPECT_EQ(builtRows(), "");
    ASSERT_TRUE(pane->_accessCache.has_value());
    EXPECT_EQ(pane->_accessCache->allBundleIDs(), std::vector<BundleIdentifier>());
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo");
}

TEST_F(AppRowsTest, AStoreThatCannotBeReadGivesNoRowsButACache) {
    addNotes({kPRVServiceTidewater}, true);
    platform.privacyConsentStore.unreadable = {kPRVServiceTidewater, kPRVServiceBrackwater};

    EXPECT_EQ(builtRows(), "");
    EXPECT_EQ(pane->_accessCache->allBundleIDs(), std::vector<BundleIdentifier>());
}

TEST_F(AppRowsTest, TheStoreIsAskedForDocumentsBeforeTheDatabase) {
    static_cast<void>(builtRows());

    EXPECT_EQ(takeCalls(), (Calls{"copy kPRVServiceTidewater", "copy kPRVServiceBrackwater"}));
}

TEST_F(AppRowsTest, ARowShowsItsApplication) {
    addNotes({kPRVServiceTidewater}, true);

    const auto row = notes();

    ASSERT_NE(row, nullptr);
    EXPECT_EQ(row->name(), Text("Notes"));
    EXPECT_EQ(row->target(), pane.get());
    EXPECT_EQ(row->cellType(), SwitchCell);
    EXPECT_EQ(row->detailControllerClass(), nullptr);
    EXPECT_TRUE(row->hasSetter());
    EXPECT_EQ(row->propertyForKey(LazyIconAppID), RowValue("com.example.notes"));
    EXPECT_EQ(row->propertyForKey(LazyIconLoading), RowValue(true));
    EXPECT_EQ(row->propertyForKey(EnabledKey), RowValue(true));
    EXPECT_EQ(row->value(), RowValue(true));
}

TEST_F(AppRowsTest, TheRowsStandByNameUnderTheirGroup) {
    for (const auto& [identifier, name] :
         {std::pair("c", "Zeta"), std::pair("a", "App 10"), std::pair("b", "app 2")}) {
        platform.applications.install(identifier, name);
        addRecord(kPRVServiceTidewater, identifier, true);
    }

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps b a c");
}

TEST_F(AppRowsTest, ApplicationsOfOneNameAlwaysStandInTheSameOrder) {
    for (const char* const identifier : {"com.b", "com.a", "com.c"}) {
        platform.applications.install(identifier, "Twin");
        addRecord(kPRVServiceTidewater, identifier, true);
    }

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps com.a com.b com.c");
}

TEST_F(AppRowsTest, AnApplicationThatOneServiceIsGrantedReadsAsOn) {
    addNotes({kPRVServiceTidewater}, false);
    addRecord(kPRVServiceBrackwater, "com.example.notes", true);

    EXPECT_EQ(notes()->value(), RowValue(true));
}

TEST_F(AppRowsTest, ARecordWithoutAnswerReadsAsOff) {
    addNotes({kPRVServiceTidewater}, std::nullopt);

    EXPECT_EQ(notes()->value(), RowValue(false));
}

TEST_F(AppRowsTest, AHiddenApplicationHasNoRowAndKeepsItsConsent) {
    addNotes({kPRVServiceTidewater}, false);
    addRecord(kPRVServiceBrackwater, "com.example.notes", std::nullopt);
    auto& app = *platform.applications.installed.at(kNotes);
    const std::vector<EntitlementValue> hiding{
        {true}, {std::int64_t{1}}, {std::int64_t{-1}}, {0.5}};
    for (const EntitlementValue& value : hiding) {
        app.granted = {{kHiddenEntitlement, value}};
        static_cast<void>(takeCalls());

        EXPECT_EQ(builtRows(), "");
        EXPECT_EQ(takeCalls(), (Calls{"copy kPRVServiceTidewater", "copy kPRVServiceBrackwater"}));
        EXPECT_FALSE(pane->_accessCache->isAccessGrantedForBundleID(kNotes));
    }
}

TEST_F(AppRowsTest, OnlyATrueNumberHidesAnApplication) {
    addNotes({kPRVServiceTidewater}, true);
    auto& app = *platform.applications.installed.at(kNotes);
    const std::vector<EntitlementValue> harmless{{false},
                                                 {std::int64_t{0}},
                                                 {0.0},
                                                 {std::string("true")},
                                                 {std::string("1")},
                                                 {},
                                                 {EntitlementArray{{true}}},
                                                 {EntitlementDictionary{{"a", {true}}}}};
    for (const EntitlementValue& value : harmless) {
        app.granted = {{kHiddenEntitlement, value}};
        EXPECT_EQ(builtRows(), "com.example.notes");
    }
    app.granted = {{"com.vantrel.another", {true}}};
    EXPECT_EQ(builtRows(), "com.example.notes");
}

TEST_F(AppRowsTest, AnApplicationThatIsNotInstalledHasNoRowButItsRecordsStay) {
    addRecord(kPRVServiceTidewater, "com.example.notes", true);

    EXPECT_EQ(builtRows(), "");
    EXPECT_TRUE(pane->_accessCache->isAccessGrantedForBundleID(kNotes));
    EXPECT_EQ(log(), LogLines());
}

TEST_F(AppRowsTest, ARemovedSystemApplicationHasNoRow) {
    addNotes({kPRVServiceTidewater}, true);
    platform.applications.installed.at(kNotes)->isRemoved = true;

    EXPECT_EQ(builtRows(), "");
    EXPECT_TRUE(pane->_accessCache->isAccessGrantedForBundleID(kNotes));
    EXPECT_EQ(log(), LogLines());
}

TEST_F(AppRowsTest, ARestrictedApplicationIsLockedAndReadsAsOff) {
    addNotes({kPRVServiceTidewater}, true);
    platform.restrictions.cloudSyncDenied.insert(kNotes);

    const auto row = notes();

    EXPECT_FALSE(row->isEnabled());
    EXPECT_EQ(row->value(), RowValue(false));
    EXPECT_TRUE(pane->_accessCache->isAccessGrantedForBundleID(kNotes));
    EXPECT_EQ(log(), LogLines());
}

TEST_F(AppRowsTest, ARestrictionIsReadForTheValueAtOnceAndForTheLockWithTheNextList) {
    addNotes({kPRVServiceTidewater}, true);
    const auto row = notes();

    platform.restrictions.cloudSyncDenied.insert(kNotes);
    EXPECT_EQ(row->value(), RowValue(false));
    EXPECT_TRUE(row->isEnabled());

    pane->reloadSpecifiers();
    EXPECT_FALSE(notes()->isEnabled());
}

TEST_F(AppRowsTest, ASwitchStillReadsTheEarlierRecordsWhileTheStoreIsAskedAnew) {
    addNotes({kPRVServiceTidewater}, true);
    const auto row = notes();
    platform.privacyConsentStore.records.clear();
    std::vector<RowValue> readings;
    platform.privacyConsentStore.onCopy = [&] { readings.push_back(row->value()); };

    static_cast<void>(builtRows());

    EXPECT_EQ(readings, (std::vector{RowValue(true), RowValue(true)}));
    EXPECT_EQ(row->value(), RowValue(false));
}

TEST_F(AppRowsTest, ConsentThatOthersChangeShowsWithTheNextList) {
    addNotes({kPRVServiceTidewater}, true);
    const auto row = notes();

    platform.privacyConsentStore.records.clear();
    addRecord(kPRVServiceTidewater, "com.example.notes", false);
    EXPECT_EQ(row->value(), RowValue(true));

    pane->reloadSpecifiers();
    EXPECT_EQ(notes()->value(), RowValue(false));
}

TEST_F(AppRowsTest, RecordsOfOneServiceCountThoughTheOthersCannotBeRead) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, true);
    const auto turnOff = [this](const PrivacyService& unreadable) {
        platform.privacyConsentStore.unreadable = {unreadable};
        pane->reloadSpecifiers();
        EXPECT_EQ(notes()->value(), RowValue(true));
        static_cast<void>(takeCalls());
        notes()->setValue(false);
        return takeCalls();
    };

    EXPECT_EQ(turnOff(kPRVServiceBrackwater),
              (Calls{"set kPRVServiceTidewater com.example.notes off",
                     "terminate com.example.notes for 3, not reported"}));
    EXPECT_EQ(turnOff(kPRVServiceTidewater),
              Calls{"set kPRVServiceBrackwater com.example.notes off"});
}

TEST_F(AppRowsTest, TheRowsAreMadeUnsortedInTheOrderOfTheRecords) {
    platform.applications.install("a", "Zeta");
    platform.applications.install("c", "Alpha");
    for (const char* const identifier : {"a", "b", "c"}) {
        addRecord(kPRVServiceTidewater, identifier, true);
    }

    const std::string made = builtRows();

    std::string expected;
    const auto bundleIDs = pane->_accessCache->allBundleIDs();
    ASSERT_TRUE(bundleIDs.has_value());
    for (const BundleIdentifier& bundleID : *bundleIDs) {
        if (bundleID.string() != "b") {
            expected += (expected.empty() ? "" : " ") + bundleID.string();
        }
    }
    EXPECT_EQ(made, expected);
    EXPECT_EQ(made.size(), 3U);
}

TEST_F(AppRowsTest, OfTwoBundlesOnlyTheFirstIsKeptAndOnlyUntilTheNextList) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, true);
    auto& records = platform.privacyConsentStore.records;
    const std::weak_ptr<Bundle> first = records[kPRVServiceTidewater].front().kPRVInfoBundle;
    const std::weak_ptr<Bundle> second = records[kPRVServiceBrackwater].front().kPRVInfoBundle;
    static_cast<void>(rows());

    records.clear();
    EXPECT_FALSE(first.expired());
    EXPECT_TRUE(second.expired());

    pane->reloadSpecifiers();
    static_cast<void>(rows());
    EXPECT_TRUE(first.expired());
}

TEST_F(AppRowsTest, ThePageThatGoesLetsTheBundlesGo) {
    addNotes({kPRVServiceTidewater}, true);
    auto& records = platform.privacyConsentStore.records;
    const std::weak_ptr<Bundle> bundle = records[kPRVServiceTidewater].front().kPRVInfoBundle;
    static_cast<void>(rows());
    records.clear();
    ASSERT_FALSE(bundle.expired());

    pane.reset();

    EXPECT_TRUE(bundle.expired());
}

TEST_F(AppRowsTest, AHiddenApplicationThatIsRestrictedKeepsItsConsentToo) {
    addNotes({kPRVServiceTidewater}, false);
    platform.applications.installed.at(kNotes)->granted = {{kHiddenEntitlement, {true}}};
    platform.restrictions.cloudSyncDenied.insert(kNotes);

    EXPECT_EQ(builtRows(), "");
    EXPECT_EQ(takeCalls(), (Calls{"copy kPRVServiceTidewater", "copy kPRVServiceBrackwater"}));
    EXPECT_EQ(log(), LogLines());
}

} // namespace
} // namespace nimbra::test
