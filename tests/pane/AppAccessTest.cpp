#include "tests/pane/AppRowsFixture.h"

namespace nimbra::test {
namespace {

const LogLines kNoCache{{LogLevel::error, "Error! No cached PRV access info"}};
const LogLines kNoBundle{{LogLevel::error, "Error! No bundle for bundle ID: com.example.notes"}};

using AppAccessTest = AppRowsFixture;

TEST_F(AppAccessTest, AnApplicationWithBothServicesHasOneRowWhichWritesBothAndEndsIt) {
    addRecord(kPRVServiceBrackwater, "com.example.other", true);
    addNotes({kPRVServiceBrackwater, kPRVServiceTidewater}, true);
    const auto row = notes();
    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive RSPStatusInfo RSPUIApps com.example.notes");
    static_cast<void>(takeCalls());

    row->setValue(false);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes off",
                                  "set kPRVServiceBrackwater com.example.notes off",
                                  "terminate com.example.notes for 3, not reported"}));
    EXPECT_EQ(row->value(), RowValue(false));
}

TEST_F(AppAccessTest, TurningOnWritesAndEndsAsTurningOffDoes) {
    addNotes({kPRVServiceTidewater}, false);
    const auto row = notes();
    static_cast<void>(takeCalls());

    row->setValue(true);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes on",
                                  "terminate com.example.notes for 3, not reported"}));
    EXPECT_EQ(row->value(), RowValue(true));
}

TEST_F(AppAccessTest, SettingTheValueThatItHasWritesItAgain) {
    addNotes({kPRVServiceTidewater}, true);
    const auto row = notes();
    static_cast<void>(takeCalls());

    row->setValue(true);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes on",
                                  "terminate com.example.notes for 3, not reported"}));
}

TEST_F(AppAccessTest, AnApplicationOfTheDatabaseAloneIsNotEnded) {
    addNotes({kPRVServiceBrackwater}, true);
    const auto row = notes();
    static_cast<void>(takeCalls());

    row->setValue(false);

    EXPECT_EQ(takeCalls(), Calls{"set kPRVServiceBrackwater com.example.notes off"});
}

TEST_F(AppAccessTest, AServiceThatIsRecordedTwiceIsWrittenTwice) {
    addNotes({kPRVServiceTidewater, kPRVServiceTidewater}, true);
    const auto row = notes();
    static_cast<void>(takeCalls());

    row->setValue(false);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes off",
                                  "set kPRVServiceTidewater com.example.notes off",
                                  "terminate com.example.notes for 3, not reported"}));
}

TEST_F(AppAccessTest, ARefusedWriteIsNeitherLoggedNorTakenBack) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, false);
    const auto row = notes();
    platform.privacyConsentStore.refuses = true;
    static_cast<void>(takeCalls());

    row->setValue(true);

    EXPECT_EQ(row->value(), RowValue(true));
    EXPECT_EQ(takeCalls().size(), 3U);
    EXPECT_EQ(log(), LogLines());
}

TEST_F(AppAccessTest, AChangeReloadsNoRow) {
    addNotes({kPRVServiceTidewater}, false);
    static_cast<void>(rows());
    static_cast<void>(takeCalls());

    notes()->setValue(true);
    platform.workQueues.mainQueue().pump();

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes on",
                                  "terminate com.example.notes for 3, not reported"}));
}

TEST_F(AppAccessTest, ARestrictionDoesNotKeepASwitchFromWriting) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, false);
    const auto row = notes();
    platform.restrictions.cloudSyncDenied.insert(kNotes);
    static_cast<void>(takeCalls());

    row->setValue(true);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceTidewater com.example.notes on",
                                  "set kPRVServiceBrackwater com.example.notes on",
                                  "terminate com.example.notes for 3, not reported"}));
    EXPECT_EQ(row->value(), RowValue(false));
    platform.restrictions.cloudSyncDenied.clear();
    EXPECT_EQ(row->value(), RowValue(true));
}

TEST_F(AppAccessTest, TheStoreIsWrittenBeforeTheCacheAndTheCacheBeforeTheEnd) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, false);
    const auto row = notes();
    std::vector<bool> readings;
    const auto read = [&] {
        readings.push_back(pane->_accessCache->isAccessGrantedForBundleID(kNotes));
    };
    platform.privacyConsentStore.onSet = read;
    platform.appTerminator.onTermination = read;

    row->setValue(true);

    EXPECT_EQ(readings, (std::vector{false, false, true}));
}

TEST_F(AppAccessTest, TheStoreGetsTheBundleOfTheDocumentsRecord) {
    addNotes({kPRVServiceBrackwater, kPRVServiceTidewater}, true);
    const auto row = notes();
    std::vector<const Bundle*> bundles;
    platform.privacyConsentStore.onSet = [&] {
        bundles.push_back(platform.privacyConsentStore.lastBundle);
    };

    row->setValue(false);

    const Bundle* const first =
        platform.privacyConsentStore.records[kPRVServiceTidewater].front().kPRVInfoBundle.get();
    EXPECT_EQ(bundles, (std::vector{first, first}));
}

TEST_F(AppAccessTest, BeforeAnyListAnApplicationReadsAsOff) {
    EXPECT_EQ(pane->_appAccessGrantedForBundleID(kNotes), RowValue(false));
    EXPECT_EQ(log(), kNoCache);
}

TEST_F(AppAccessTest, BeforeAnyListARestrictedApplicationReadsAsOffWithoutAWord) {
    platform.restrictions.cloudSyncDenied.insert(kNotes);

    EXPECT_EQ(pane->_appAccessGrantedForBundleID(kNotes), RowValue(false));
    EXPECT_EQ(log(), LogLines());
}

TEST_F(AppAccessTest, BeforeAnyListNothingIsWritten) {
    pane->_setAppAccessGrantedForBundleID(true, kNotes);

    EXPECT_EQ(log(), kNoCache);
    EXPECT_EQ(takeCalls(), Calls());
}

TEST_F(AppAccessTest, BeforeAnyListAHiddenApplicationIsAskedForAndNotWritten) {
    platform.applications.install("com.example.notes", "Notes").granted = {
        {"com.vantrel.private.vantrelaccount.app-hidden-from-nimbra-settings", {true}}};

    EXPECT_EQ(pane->_appSpecifierWithBundleID(kNotes), nullptr);

    EXPECT_EQ(log(), kNoCache) << "asked once, and written never";
    EXPECT_EQ(takeCalls(), Calls());
}

TEST_F(AppAccessTest, AnApplicationThatHasGoneFromTheRecordsIsLoggedAndWritesNothing) {
    addNotes({kPRVServiceTidewater}, true);
    const auto row = notes();
    platform.privacyConsentStore.records.clear();
    pane->reloadSpecifiers();
    static_cast<void>(rows());
    static_cast<void>(takeCalls());

    row->setValue(false);

    EXPECT_EQ(log(), kNoBundle);
    EXPECT_EQ(takeCalls(), Calls());
}

/// A cache whose application has a service but no bundle.
class CacheWithoutBundle final : public RSPServiceAccessCache {
public:
    CacheWithoutBundle(const BundleIdentifier& bundleID, const ServiceEntries& services) {
        _accessInfoByBundleID.emplace();
        _accessInfoByBundleID->insert({bundleID, {.services = services, .bundle = nullptr}});
    }
};

TEST_F(AppAccessTest, AnAbsentBundleIsLoggedAndReachesTheStoreAllTheSame) {
    addNotes({kPRVServiceTidewater, kPRVServiceBrackwater}, true);
    const auto row = notes();
    pane->_accessCache.emplace(
        CacheWithoutBundle(kNotes, *pane->_accessCache->servicesForBundleID(kNotes)));
    static_cast<void>(takeCalls());
    std::optional<LogLines> linesBeforeFirstSet;
    platform.privacyConsentStore.onSet = [&] {
        linesBeforeFirstSet = linesBeforeFirstSet.value_or(log());
    };

    row->setValue(false);

    EXPECT_EQ(linesBeforeFirstSet, kNoBundle);
    EXPECT_EQ(log(), kNoBundle);
    EXPECT_EQ(takeCalls(),
              (Calls{"set kPRVServiceTidewater nobody off", "set kPRVServiceBrackwater nobody off",
                     "terminate com.example.notes for 3, not reported"}));
    EXPECT_EQ(row->value(), RowValue(false));
}

TEST_F(AppAccessTest, TheServicesThatItHasAfterTheWriteDecideWhetherItIsEnded) {
    addNotes({kPRVServiceBrackwater}, true);
    const auto row = notes();
    platform.privacyConsentStore.onSet = [this] {
        pane->_accessCache->addAccessInfoForServiceName(
            PrivacyAccessRecords{
                {.kPRVInfoBundle = std::make_shared<FakeBundle>(kNotes), .kPRVInfoGranted = true}},
            kPRVServiceTidewater);
    };
    static_cast<void>(takeCalls());

    row->setValue(false);

    EXPECT_EQ(takeCalls(), (Calls{"set kPRVServiceBrackwater com.example.notes off",
                                  "terminate com.example.notes for 3, not reported"}));
}

} // namespace
} // namespace nimbra::test
