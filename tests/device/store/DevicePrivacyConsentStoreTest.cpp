#include "device/store/DevicePrivacyConsentStore.h"

#include "device/store/ConsentBundle.h"
#include "tests/device/FullDisk.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/Threads.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace nimbra::device {
namespace {

using Lines = std::vector<std::string>;

/// The records as text: "a+" is granted, "a-" refused, "a?" not said; "." has no identifier.
std::string summaryOf(const std::optional<PrivacyAccessRecords>& records) {
    std::string summary = records ? "" : "absent";
    for (const PrivacyAccessRecord& record : records.value_or(PrivacyAccessRecords())) {
        const auto& identifier = record.kPRVInfoBundle->identifier();
        summary += summary.empty() ? "" : " ";
        summary += identifier ? identifier->string() : ".";
        summary += !record.kPRVInfoGranted ? '?' : *record.kPRVInfoGranted ? '+' : '-';
    }
    return summary;
}

class DevicePrivacyConsentStoreTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path directory() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path path() const { return directory() / "consent.db"; }
    [[nodiscard]] Lines lines() const { return _log.lines(); }

    void create(const std::vector<DeviceDescription::ConsentRecord>& records) const {
        auto database = ConsentDatabase::create(path());
        ASSERT_TRUE(database) << database.error();
        ASSERT_TRUE(database->replaceRecords(records));
    }

    /// A store on a connection of its own, as another process would have it.
    [[nodiscard]] std::unique_ptr<DevicePrivacyConsentStore>
    openStore(std::chrono::milliseconds patience = Database::patience) {
        auto database = ConsentDatabase::open(path(), patience);
        EXPECT_TRUE(database) << database.error();
        return std::make_unique<DevicePrivacyConsentStore>(path(), std::move(*database), _log);
    }

    /// What a new connection finds of cloud-document storage.
    [[nodiscard]] std::string stored() {
        return summaryOf(openStore()->PRVAccessCopyInformation(kPRVServiceTidewater));
    }

    [[nodiscard]] static bool set(DevicePrivacyConsentStore& store, const std::string& identifier,
                                  bool granted) {
        const ConsentBundle bundle{BundleIdentifier(identifier)};
        return store.PRVAccessSetForBundle(kPRVServiceTidewater, &bundle, granted);
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
};

const std::string tidewater = kPRVServiceTidewater.string();
const std::string brackwater = kPRVServiceBrackwater.string();
const std::string cannotSet = "Can't set the consent for kPRVServiceTidewater of a: "
                              "/var/lib/nimbra/consent.db: ";

TEST_F(DevicePrivacyConsentStoreTest, RecordsAreGivenInTheirOrderWithWhatTheyLack) {
    create({{.service = tidewater, .bundle = "z", .granted = true},
            {.service = tidewater, .bundle = std::nullopt, .granted = false},
            {.service = brackwater, .bundle = "b", .granted = true},
            {.service = tidewater, .bundle = "a", .granted = std::nullopt},
            {.service = tidewater, .bundle = "z", .granted = false}});
    const auto store = openStore();

    EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceTidewater)), "z+ .- a? z-");
    EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceBrackwater)), "b+");
}

TEST_F(DevicePrivacyConsentStoreTest, TheBundleOfARecordHasNoTexts) {
    create({{.service = tidewater, .bundle = "a"}});
    const auto records = openStore()->PRVAccessCopyInformation(kPRVServiceTidewater);
    ASSERT_TRUE(records && records->size() == 1);
    const Text value("value");

    const Text found = records->front().kPRVInfoBundle->localizedStringForKeyValueTable(
        Text("key"), value, Text("Localizable"));

    EXPECT_TRUE(found.isSameObjectAs(value));
}

TEST_F(DevicePrivacyConsentStoreTest, WhatAnotherProcessWroteIsSeenAtTheNextCopyAndNotBefore) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    const auto store = openStore();
    const auto before = store->PRVAccessCopyInformation(kPRVServiceTidewater);

    ASSERT_TRUE(set(*openStore(), "a", false));
    ASSERT_TRUE(set(*openStore(), "b", true));

    EXPECT_EQ(summaryOf(before), "a+");
    EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceTidewater)), "a- b+");
}

TEST_F(DevicePrivacyConsentStoreTest, WhatWasSetIsThereForANewConnection) {
    create({{.service = tidewater, .bundle = "a", .granted = std::nullopt}});
    const auto store = openStore();

    EXPECT_TRUE(set(*store, "a", true));
    EXPECT_TRUE(set(*store, "unknown", false));

    EXPECT_EQ(stored(), "a+ unknown-");
    EXPECT_TRUE(lines().empty());
}

TEST_F(DevicePrivacyConsentStoreTest, ABundleThatIsAbsentOrNamelessIsRefusedWithoutALine) {
    create({{.service = tidewater, .bundle = std::nullopt, .granted = true}});
    const auto before = test::treeOf(directory());
    {
        const auto store = openStore();
        const ConsentBundle nameless{std::nullopt};

        EXPECT_FALSE(store->PRVAccessSetForBundle(kPRVServiceTidewater, nullptr, false));
        EXPECT_FALSE(store->PRVAccessSetForBundle(kPRVServiceTidewater, &nameless, false));
    }
    EXPECT_EQ(test::treeOf(directory()), before);
    EXPECT_TRUE(lines().empty());
}

TEST_F(DevicePrivacyConsentStoreTest, WithoutADatabaseThereAreNoRecordsAndTheFirstWriteMakesIt) {
    const auto store = openStore();

    EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceTidewater)), "");
    EXPECT_FALSE(std::filesystem::exists(path()));
    EXPECT_TRUE(set(*store, "a", true));

    EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceTidewater)), "a+");
    EXPECT_EQ(stored(), "a+");
    EXPECT_TRUE(lines().empty());
}

TEST_F(DevicePrivacyConsentStoreTest, ADatabaseThatAnotherProcessMadeMeanwhileIsUsed) {
    const auto reader = openStore();
    const auto writer = openStore();
    create({{.service = tidewater, .bundle = "a", .granted = true}});

    EXPECT_EQ(summaryOf(reader->PRVAccessCopyInformation(kPRVServiceTidewater)), "a+");
    EXPECT_TRUE(set(*writer, "b", true));

    EXPECT_EQ(stored(), "a+ b+");
}

TEST_F(DevicePrivacyConsentStoreTest, StoresThatMakeTheDatabaseAtOnceLoseNothing) {
    const auto first = openStore();
    const auto second = openStore();

    test::runAtOnce({[&first] { EXPECT_TRUE(set(*first, "a", true)); },
                     [&second] { EXPECT_TRUE(set(*second, "b", true)); }});

    const std::string found = stored();
    EXPECT_TRUE(found == "a+ b+" || found == "b+ a+") << found;
    EXPECT_TRUE(lines().empty());
}

TEST_F(DevicePrivacyConsentStoreTest, RecordsThatCannotBeReadAreAbsentWithOneLine) {
    create({{.service = tidewater, .bundle = "a"}});
    const auto store = openStore();
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE).exec("DROP TABLE consent");

    EXPECT_EQ(store->PRVAccessCopyInformation(kPRVServiceTidewater), std::nullopt);

    EXPECT_EQ(lines(), Lines{"Can't read the consent for kPRVServiceTidewater: "
                             "/var/lib/nimbra/consent.db: no such table: consent"});
}

TEST_F(DevicePrivacyConsentStoreTest, AFolderThatCannotBeFlushedIsCalledAsTheDeviceDoes) {
    using std::filesystem::perms;
    const auto other = directory() / "other";
    std::filesystem::create_directory(other);
    const auto store = openStore();
    std::filesystem::permissions(directory(), perms(0333));
    {
        // Root may read everything, so the test is somebody else for a while.
        const test::ReadOnly readOnly(other);
        EXPECT_FALSE(set(*store, "a", true));
    }
    std::filesystem::permissions(directory(), perms(0700));

    EXPECT_EQ(lines(), Lines{"Can't set the consent for kPRVServiceTidewater of a: "
                             "/var/lib/nimbra: cannot be flushed: Permission denied"});
}

TEST_F(DevicePrivacyConsentStoreTest, ADatabaseThatCameDamagedIsReportedAndLeftAsItWas) {
    const auto store = openStore();
    test::writeTestFile(path(), std::string(5000, 'x'));
    const auto before = test::treeOf(directory());

    EXPECT_EQ(store->PRVAccessCopyInformation(kPRVServiceTidewater), std::nullopt);
    EXPECT_FALSE(set(*store, "a", true));

    const std::string reason = "not a consent database: file is not a database";
    EXPECT_EQ(lines(), (Lines{"Can't read the consent for kPRVServiceTidewater: "
                              "/var/lib/nimbra/consent.db: " +
                                  reason,
                              cannotSet + reason}));
    EXPECT_EQ(test::treeOf(directory()), before);
}

TEST_F(DevicePrivacyConsentStoreTest, AReadOnlyDatabaseCanBeReadAndRefusesTheWrite) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    {
        const test::ReadOnly readOnly(directory());
        const auto store = openStore();

        EXPECT_EQ(summaryOf(store->PRVAccessCopyInformation(kPRVServiceTidewater)), "a+");
        EXPECT_FALSE(set(*store, "a", false));
    }
    EXPECT_EQ(lines(), Lines{cannotSet + "it can only be read"});
    EXPECT_EQ(stored(), "a+");
}

TEST_F(DevicePrivacyConsentStoreTest, OnAReadOnlyDeviceNoDatabaseIsMade) {
    {
        const test::ReadOnly readOnly(directory());
        const auto store = openStore();

        EXPECT_FALSE(set(*store, "a", false));
    }
    EXPECT_EQ(lines(), Lines{cannotSet + "cannot be made: Permission denied"});
    EXPECT_TRUE(test::treeOf(directory()).empty());
}

TEST_F(DevicePrivacyConsentStoreTest, AFullDiskFailsTheWriteAndTheOldStateStands) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    const auto store = openStore();
    {
        const test::FullDisk fullDisk;
        EXPECT_FALSE(set(*store, "a", false));
    }
    EXPECT_EQ(lines().size(), 1U);
    EXPECT_EQ(stored(), "a+");
    EXPECT_TRUE(set(*store, "a", false));
    EXPECT_EQ(stored(), "a-");
}

TEST_F(DevicePrivacyConsentStoreTest, AFullDiskLeavesNoHalfMadeDatabase) {
    const auto store = openStore();
    {
        const test::FullDisk fullDisk;
        EXPECT_FALSE(set(*store, "a", false));
    }
    EXPECT_EQ(lines().size(), 1U);
    EXPECT_TRUE(lines().front().starts_with(cannotSet)) << lines().front();
    EXPECT_TRUE(test::treeOf(directory()).empty());
    EXPECT_TRUE(set(*store, "a", false));
}

TEST_F(DevicePrivacyConsentStoreTest, ADatabaseInUsePastThePatienceRefusesTheWrite) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    const auto store = openStore(std::chrono::milliseconds(1));
    SQLite::Database other(path().string(), SQLite::OPEN_READWRITE);
    other.exec("BEGIN IMMEDIATE");

    EXPECT_FALSE(set(*store, "a", false));

    EXPECT_EQ(lines(), Lines{cannotSet + "another program is using it"});
}

TEST_F(DevicePrivacyConsentStoreTest, PlannedOutcomesAreUsedUpOneACall) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    const auto store = openStore();
    store->planSetOutcomes({false, std::nullopt, false, std::nullopt, false});

    EXPECT_FALSE(set(*store, "a", false));
    EXPECT_EQ(stored(), "a+");
    EXPECT_TRUE(set(*store, "a", false));
    EXPECT_EQ(stored(), "a-");
    EXPECT_FALSE(set(*store, "a", true));
    // A call that would be refused anyway uses up an outcome like any other.
    EXPECT_FALSE(store->PRVAccessSetForBundle(kPRVServiceTidewater, nullptr, true));
    EXPECT_FALSE(set(*store, "a", true));
    EXPECT_EQ(stored(), "a-");
    EXPECT_TRUE(set(*store, "a", true));
    EXPECT_EQ(stored(), "a+");
    EXPECT_TRUE(lines().empty());
}

TEST_F(DevicePrivacyConsentStoreTest, OutcomesPlannedAnewReplaceThoseThatAreLeft) {
    create({});
    const auto store = openStore();
    store->planSetOutcomes({false, false});

    store->planSetOutcomes({});

    EXPECT_TRUE(set(*store, "a", true));
}

TEST_F(DevicePrivacyConsentStoreTest, ManyThreadsMayAskAndSetAtOnce) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    const auto store = openStore();
    constexpr int rounds = 20;
    const auto ask = [&store] {
        for (int round = 0; round < rounds; ++round) {
            EXPECT_EQ(store->PRVAccessCopyInformation(kPRVServiceTidewater)->size(), 1U);
        }
    };
    const auto flip = [&store] {
        for (int round = 0; round < rounds; ++round) {
            EXPECT_TRUE(set(*store, "a", round % 2 == 1));
        }
    };

    test::runAtOnce({ask, flip, ask, flip});

    EXPECT_EQ(stored(), "a+");
    EXPECT_TRUE(lines().empty());
}

} // namespace
} // namespace nimbra::device
