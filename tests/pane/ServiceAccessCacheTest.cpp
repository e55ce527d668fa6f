#include "pane/RSPServiceAccessCache.h"
#include "tests/support/FakeBundle.h"

#include <algorithm>
#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

using Services = std::vector<PrivacyService>;
using BundleIDs = std::vector<BundleIdentifier>;

const BundleIdentifier kNotes("com.example.notes");
const BundleIdentifier kSketches("com.example.sketches");

std::shared_ptr<Bundle> bundle(const BundleIdentifier& identifier) {
    return std::make_shared<FakeBundle>(identifier);
}

PrivacyAccessRecord record(const BundleIdentifier& identifier, std::optional<bool> granted) {
    return {.kPRVInfoBundle = bundle(identifier), .kPRVInfoGranted = granted};
}

struct ServiceAccessCacheTest : testing::Test {
    RSPServiceAccessCache cache;

    void addTidewater(const PrivacyAccessRecords& records) {
        cache.addAccessInfoForServiceName(records, kPRVServiceTidewater);
    }
    void addBrackwater(const PrivacyAccessRecords& records) {
        cache.addAccessInfoForServiceName(records, kPRVServiceBrackwater);
    }
};

TEST_F(ServiceAccessCacheTest, BeforeItIsFilledItAnswersWithNothing) {
    EXPECT_EQ(cache.allBundleIDs(), std::nullopt);
    EXPECT_FALSE(cache.isAccessGrantedForBundleID(kNotes));
    EXPECT_EQ(cache.bundleForBundleID(kNotes), nullptr);
    EXPECT_EQ(cache.servicesForBundleID(kNotes), nullptr);
    EXPECT_EQ(cache.serviceNamesForBundleID(kNotes), std::nullopt);
    cache.setAccessGrantedForBundleID(true, kNotes);
    EXPECT_EQ(cache.allBundleIDs(), std::nullopt);
}

TEST_F(ServiceAccessCacheTest, FilledWithoutRecordsItHasAnEmptyList) {
    addTidewater({});
    addBrackwater({});

    EXPECT_EQ(cache.allBundleIDs(), BundleIDs());
}

TEST_F(ServiceAccessCacheTest, AbsentRecordsFillItLikeNone) {
    cache.addAccessInfoForServiceName(std::nullopt, kPRVServiceTidewater);

    EXPECT_EQ(cache.allBundleIDs(), BundleIDs());
}

TEST_F(ServiceAccessCacheTest, AnApplicationThatItDoesNotKnowHasNothing) {
    addTidewater({record(kNotes, true)});

    EXPECT_FALSE(cache.isAccessGrantedForBundleID(kSketches));
    EXPECT_EQ(cache.bundleForBundleID(kSketches), nullptr);
    EXPECT_EQ(cache.servicesForBundleID(kSketches), nullptr);
    EXPECT_EQ(cache.serviceNamesForBundleID(kSketches), std::nullopt);
    cache.setAccessGrantedForBundleID(false, kSketches);
    EXPECT_EQ(cache.allBundleIDs(), BundleIDs{kNotes});
    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kNotes));
}

TEST_F(ServiceAccessCacheTest, ARecordThatDoesNotSayWhetherAccessIsGrantedCountsAsRefused) {
    addTidewater({record(kNotes, std::nullopt)});

    ASSERT_EQ(cache.servicesForBundleID(kNotes)->size(), 1U);
    EXPECT_FALSE(cache.servicesForBundleID(kNotes)->front().granted);
    EXPECT_FALSE(cache.isAccessGrantedForBundleID(kNotes));
}

TEST_F(ServiceAccessCacheTest, ARecordWhoseBundleHasNoIdentifierIsLeftOut) {
    addTidewater(
        {{.kPRVInfoBundle = std::make_shared<FakeBundle>(std::nullopt), .kPRVInfoGranted = true},
         record(kNotes, true)});

    EXPECT_EQ(cache.allBundleIDs(), BundleIDs{kNotes});
}

TEST_F(ServiceAccessCacheTest, TheServicesOfAnApplicationStandTogetherInTheOrderOfTheirComing) {
    const PrivacyAccessRecord first = record(kNotes, true);
    addTidewater({first, record(kSketches, false)});
    addBrackwater({record(kNotes, false)});

    auto bundleIDs = cache.allBundleIDs().value();
    std::ranges::sort(bundleIDs);
    EXPECT_EQ(bundleIDs, (BundleIDs{kNotes, kSketches}));
    EXPECT_EQ(cache.serviceNamesForBundleID(kNotes),
              (Services{kPRVServiceTidewater, kPRVServiceBrackwater}));
    EXPECT_EQ(cache.serviceNamesForBundleID(kSketches), Services{kPRVServiceTidewater});
    const auto& services = *cache.servicesForBundleID(kNotes);
    ASSERT_EQ(services.size(), 2U);
    EXPECT_TRUE(services[0].granted);
    EXPECT_EQ(services[0].serviceName, kPRVServiceTidewater);
    EXPECT_FALSE(services[1].granted);
    EXPECT_EQ(services[1].serviceName, kPRVServiceBrackwater);
    EXPECT_EQ(cache.bundleForBundleID(kNotes), first.kPRVInfoBundle.get());
}

TEST_F(ServiceAccessCacheTest, ABundleIsKeptAliveAsLongAsItsApplicationIsKnown) {
    auto notes = bundle(kNotes);
    const std::weak_ptr<Bundle> watched = notes;
    addTidewater({{.kPRVInfoBundle = std::move(notes), .kPRVInfoGranted = true}});

    EXPECT_FALSE(watched.expired());
    cache = RSPServiceAccessCache();
    EXPECT_TRUE(watched.expired());
}

TEST_F(ServiceAccessCacheTest, AccessIsGrantedWhereOneServiceIsWhicheverItIs) {
    addTidewater({record(kNotes, true), record(kSketches, false)});
    addBrackwater({record(kNotes, false), record(kSketches, true)});

    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kNotes));
    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kSketches));
}

TEST_F(ServiceAccessCacheTest, SettingAccessSetsEveryServiceOfThatApplicationOnly) {
    const PrivacyAccessRecord first = record(kNotes, true);
    addTidewater({first, record(kSketches, true)});
    addBrackwater({record(kNotes, false)});

    cache.setAccessGrantedForBundleID(false, kNotes);
    EXPECT_FALSE(cache.isAccessGrantedForBundleID(kNotes));
    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kSketches));

    cache.setAccessGrantedForBundleID(true, kNotes);
    for (const auto& service : *cache.servicesForBundleID(kNotes)) {
        EXPECT_TRUE(service.granted) << service.serviceName;
    }
    EXPECT_EQ(cache.serviceNamesForBundleID(kNotes),
              (Services{kPRVServiceTidewater, kPRVServiceBrackwater}));
    EXPECT_EQ(cache.bundleForBundleID(kNotes), first.kPRVInfoBundle.get());
}

TEST_F(ServiceAccessCacheTest, AServiceThatIsAddedTwiceIsThereTwice) {
    addTidewater({record(kNotes, true)});
    addTidewater({record(kNotes, false)});

    EXPECT_EQ(cache.serviceNamesForBundleID(kNotes),
              (Services{kPRVServiceTidewater, kPRVServiceTidewater}));
    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kNotes));
}

TEST_F(ServiceAccessCacheTest, TheServicesAreTheCachesOwn) {
    addTidewater({record(kNotes, false)});
    auto* services = cache.servicesForBundleID(kNotes);

    services->front().granted = true;
    EXPECT_TRUE(cache.isAccessGrantedForBundleID(kNotes));
    cache.setAccessGrantedForBundleID(false, kNotes);
    EXPECT_FALSE(services->front().granted);
}

TEST_F(ServiceAccessCacheTest, RecordsThatAreAbsentChangeNothingOfAnotherService) {
    addTidewater({record(kNotes, true)});
    for (const auto& none : {std::optional<PrivacyAccessRecords>(),
                             std::optional<PrivacyAccessRecords>(PrivacyAccessRecords())}) {
        cache.addAccessInfoForServiceName(none, kPRVServiceBrackwater);

        EXPECT_EQ(cache.allBundleIDs(), BundleIDs{kNotes});
        EXPECT_EQ(cache.serviceNamesForBundleID(kNotes), Services{kPRVServiceTidewater});
        EXPECT_TRUE(cache.isAccessGrantedForBundleID(kNotes));
    }
}

TEST_F(ServiceAccessCacheTest, RecordsOfOneArrayKeepItsOrderAndTheBundleOfTheFirst) {
    const PrivacyAccessRecord first = record(kNotes, true);
    addTidewater({first, record(kNotes, false)});

    EXPECT_EQ(cache.bundleForBundleID(kNotes), first.kPRVInfoBundle.get());
    const auto& services = *cache.servicesForBundleID(kNotes);
    ASSERT_EQ(services.size(), 2U);
    EXPECT_TRUE(services[0].granted);
    EXPECT_FALSE(services[1].granted);
}

TEST_F(ServiceAccessCacheTest, AnApplicationWithoutServicesHasNoAccessAndAnEmptyListOfNames) {
    addTidewater({record(kNotes, true)});

    cache.servicesForBundleID(kNotes)->clear();

    EXPECT_FALSE(cache.isAccessGrantedForBundleID(kNotes));
    EXPECT_EQ(cache.serviceNamesForBundleID(kNotes), Services());
}

} // namespace
} // namespace nimbra::test
