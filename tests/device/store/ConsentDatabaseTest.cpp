#include "device/store/ConsentDatabase.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <algorithm>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {
namespace {

using Record = ConsentDatabase::Record;
using Records = std::vector<Record>;
using Descriptions = std::vector<DeviceDescription::ConsentRecord>;

const std::string tidewater = kPRVServiceTidewater.string();
const std::string brackwater = kPRVServiceBrackwater.string();

Record record(const std::string& bundle, std::optional<bool> granted) {
    return {.bundle = BundleIdentifier(bundle), .granted = granted};
}

class ConsentDatabaseTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path directory() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path path() const { return directory() / "consent.db"; }

    void create(const Descriptions& records) const {
        auto database = ConsentDatabase::create(path());
        ASSERT_TRUE(database) << database.error();
        const auto written = database->replaceRecords(records);
        ASSERT_TRUE(written) << written.error();
    }

    [[nodiscard]] ConsentDatabase
    open(std::chrono::milliseconds patience = Database::patience) const {
        auto database = ConsentDatabase::open(path(), patience);
        EXPECT_TRUE(database && *database);
        return std::move(**database);
    }

    /// What a new connection finds of `service`.
    [[nodiscard]] Records stored(const PrivacyService& service) const {
        const auto records = open().records(service);
        EXPECT_TRUE(records) << records.error();
        return *records;
    }

    /// Runs `sql` as another program would.
    void execute(const std::string& sql) const {
        SQLite::Database(path().string(), SQLite::OPEN_READWRITE).exec(sql);
    }

    /// Expects that opening fails for `reason`, or one that begins so, and leaves every byte as it
    /// was.
    void expectRefusal(const std::string& reason) const {
        const auto before = test::treeOf(directory());
        const auto database = ConsentDatabase::open(path());
        ASSERT_FALSE(database);
        EXPECT_TRUE(database.error().description.starts_with(path().string() + ": " + reason))
            << database.error();
        EXPECT_EQ(test::treeOf(directory()), before);
    }
    void expectNoDatabase(const std::string& reason) const {
        expectRefusal("not a consent database: " + reason);
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(ConsentDatabaseTest, RecordsKeepTheOrderInWhichTheyCameWithWhatIsLacking) {
    create({{.service = tidewater, .bundle = "z", .granted = true},
            {.service = brackwater, .bundle = "z", .granted = std::nullopt},
            {.service = tidewater, .bundle = std::nullopt, .granted = true},
            {.service = tidewater, .bundle = "a", .granted = std::nullopt},
            {.service = tidewater, .bundle = "z", .granted = false},
            {.service = tidewater}});

    EXPECT_EQ(stored(kPRVServiceTidewater), (Records{record("z", true),
                                                     {.bundle = std::nullopt, .granted = true},
                                                     record("a", std::nullopt),
                                                     record("z", false),
                                                     {}}));
    EXPECT_EQ(stored(kPRVServiceBrackwater), Records{record("z", std::nullopt)});
    EXPECT_EQ(stored(PrivacyService("kPRVServiceCamera")), Records());
}

TEST_F(ConsentDatabaseTest, OddIdentifiersAreKeptByteForByte) {
    const std::string odd = std::string("a\0b\n\"'\\ ", 9) + "😀 مرحبا ";
    create({{.service = tidewater, .bundle = odd, .granted = true},
            {.service = tidewater, .bundle = "", .granted = true}});

    EXPECT_EQ(stored(kPRVServiceTidewater), (Records{record(odd, true), record("", true)}));
}

TEST_F(ConsentDatabaseTest, SettingChangesAllRecordsOfTheApplicationAndServiceWhereTheyStand) {
    create({{.service = tidewater, .bundle = "a", .granted = true},
            {.service = tidewater, .bundle = "b", .granted = true},
            {.service = brackwater, .bundle = "a", .granted = true},
            {.service = tidewater, .bundle = "a", .granted = std::nullopt},
            {.service = tidewater, .bundle = std::nullopt, .granted = true}});

    ASSERT_TRUE(open().setGranted(kPRVServiceTidewater, BundleIdentifier("a"), false));

    EXPECT_EQ(stored(kPRVServiceTidewater), (Records{record("a", false),
                                                     record("b", true),
                                                     record("a", false),
                                                     {.bundle = std::nullopt, .granted = true}}));
    EXPECT_EQ(stored(kPRVServiceBrackwater), Records{record("a", true)});
}

TEST_F(ConsentDatabaseTest, SettingAnUnknownApplicationAddsOneRecordAtTheEnd) {
    create({{.service = tidewater, .bundle = "z", .granted = true},
            {.service = brackwater, .bundle = "a", .granted = true}});
    ConsentDatabase database = open();

    ASSERT_TRUE(database.setGranted(kPRVServiceTidewater, BundleIdentifier("a"), true));
    ASSERT_TRUE(database.setGranted(kPRVServiceTidewater, BundleIdentifier("a"), false));

    EXPECT_EQ(stored(kPRVServiceTidewater), (Records{record("z", true), record("a", false)}));
    EXPECT_EQ(stored(kPRVServiceBrackwater), Records{record("a", true)});
}

TEST_F(ConsentDatabaseTest, ReplacedRecordsAreGone) {
    create({{.service = tidewater, .bundle = "old", .granted = true},
            {.service = brackwater, .bundle = "old", .granted = true}});

    ASSERT_TRUE(open().replaceRecords({{.service = tidewater, .bundle = "new"}}));

    EXPECT_EQ(stored(kPRVServiceTidewater), Records{record("new", std::nullopt)});
    EXPECT_EQ(stored(kPRVServiceBrackwater), Records());
}

TEST_F(ConsentDatabaseTest, AReplacementThatFailsHalfwayLeavesTheOldRecords) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    execute("CREATE TRIGGER refusal BEFORE INSERT ON consent WHEN NEW.bundle = 'bad' "
            "BEGIN SELECT RAISE(ABORT, 'refused'); END");

    const auto written = open().replaceRecords(
        {{.service = tidewater, .bundle = "good"}, {.service = tidewater, .bundle = "bad"}});

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description, path().string() + ": refused");
    EXPECT_EQ(stored(kPRVServiceTidewater), Records{record("a", true)});
}

TEST_F(ConsentDatabaseTest, ASettingThatFailsHalfwayLeavesAllRecordsAsTheyWere) {
    create({{.service = tidewater, .bundle = "a", .granted = true},
            {.service = tidewater, .bundle = "a", .granted = std::nullopt}});
    execute("CREATE TRIGGER refusal BEFORE UPDATE ON consent WHEN OLD.granted IS NULL "
            "BEGIN SELECT RAISE(FAIL, 'refused'); END");

    EXPECT_FALSE(open().setGranted(kPRVServiceTidewater, BundleIdentifier("a"), false));

    EXPECT_EQ(stored(kPRVServiceTidewater),
              (Records{record("a", true), record("a", std::nullopt)}));
}

TEST_F(ConsentDatabaseTest, ADatabaseInUsePastThePatienceFailsTheSetting) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});
    ConsentDatabase database = open(std::chrono::milliseconds(1));
    SQLite::Database other(path().string(), SQLite::OPEN_READWRITE);
    other.exec("BEGIN IMMEDIATE");

    const auto written = database.setGranted(kPRVServiceTidewater, BundleIdentifier("a"), false);

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description, path().string() + ": another program is using it");
    EXPECT_EQ(database.records(kPRVServiceTidewater), Records{record("a", true)});
}

TEST_F(ConsentDatabaseTest, TenThousandRecordsKeepTheirOrder) {
    constexpr int count = 10'000;
    Descriptions descriptions;
    Records expected;
    for (int index = count; index > 0; --index) {
        const std::string bundle = "com.example.app" + std::to_string(index);
        const bool granted = index % 3 == 0;
        descriptions.push_back({.service = tidewater, .bundle = bundle, .granted = granted});
        descriptions.push_back({.service = brackwater, .bundle = bundle, .granted = granted});
        expected.push_back(record(bundle, granted));
    }

    create(descriptions);

    EXPECT_EQ(stored(kPRVServiceTidewater), expected);
    EXPECT_EQ(stored(kPRVServiceBrackwater), expected);
}

TEST_F(ConsentDatabaseTest, NothingButTheDatabaseIsMade) {
    create({});

    const auto tree = test::treeOf(directory());
    EXPECT_EQ(tree.size(), 1U);
    EXPECT_TRUE(tree.contains("consent.db"));
    EXPECT_EQ(std::filesystem::hard_link_count(path()), 1U);
}

TEST_F(ConsentDatabaseTest, WhereAnotherProcessWasFasterItsDatabaseIsUsed) {
    create({{.service = tidewater, .bundle = "a", .granted = true}});

    auto second = ConsentDatabase::create(path());

    ASSERT_TRUE(second) << second.error();
    EXPECT_EQ(second->records(kPRVServiceTidewater), Records{record("a", true)});
    second = std::unexpected(Error());
    EXPECT_EQ(test::treeOf(directory()).size(), 1U);
}

TEST_F(ConsentDatabaseTest, ADatabaseThatCannotBeMadeIsAnError) {
    const auto place = directory() / "none/consent.db";

    const auto created = ConsentDatabase::create(place);

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              place.string() + ": cannot be made: No such file or directory");
    EXPECT_TRUE(test::treeOf(directory()).empty());
}

TEST_F(ConsentDatabaseTest, ChangesThatALostDatabaseLeftDoNotBecomeThoseOfANewOne) {
    const auto changes = directory() / "consent.db-wal";
    test::writeTestFile(changes, "left behind");

    const auto database = ConsentDatabase::create(path());

    ASSERT_FALSE(database);
    EXPECT_EQ(database.error().description,
              changes.string() + ": stands here without its database");
    EXPECT_FALSE(std::filesystem::exists(path()));
    EXPECT_TRUE(std::filesystem::exists(changes));
}

TEST_F(ConsentDatabaseTest, AMissingDatabaseIsNoErrorAndNotMade) {
    const auto opened = ConsentDatabase::open(path());

    ASSERT_TRUE(opened) << opened.error();
    EXPECT_FALSE(*opened);
    EXPECT_TRUE(test::treeOf(directory()).empty());
}

TEST_F(ConsentDatabaseTest, ADirectoryInItsPlaceIsReported) {
    std::filesystem::create_directory(path());
    expectRefusal("cannot be read: Is a directory");
}

TEST_F(ConsentDatabaseTest, AFileThatIsNoDatabaseIsReportedAndLeftAsItWas) {
    test::writeTestFile(path(), std::string(5000, 'x'));
    expectNoDatabase("file is not a database");
}

TEST_F(ConsentDatabaseTest, AnEmptyFileIsReportedAndLeftAsItWas) {
    test::writeTestFile(path(), "");
    expectNoDatabase("it has no version");
}

TEST_F(ConsentDatabaseTest, ADatabaseOfAnotherKindIsReportedAndLeftAsItWas) {
    SQLite::Database(path().string(), SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE)
        .exec("CREATE TABLE accounts (t); PRAGMA user_version = 1");
    expectNoDatabase("no such table: consent");
}

TEST_F(ConsentDatabaseTest, ADatabaseOfALaterVersionIsReportedAndLeftAsItWas) {
    create({{.service = tidewater, .bundle = "a"}});
    execute("PRAGMA user_version = 7");
    expectNoDatabase("it has version 7, this program knows up to 1");
}

TEST_F(ConsentDatabaseTest, ADamagedDatabaseIsReportedAndLeftAsItWas) {
    create(Descriptions(2000, {.service = tidewater, .bundle = "com.example.app"}));
    std::string bytes = test::contentOf(path());
    // Every page but the first, which names the table.
    std::ranges::fill(bytes.begin() + 4096, bytes.end(), '\xa5');
    test::writeTestFile(path(), bytes);

    expectNoDatabase("it is damaged: ");
}

TEST_F(ConsentDatabaseTest, TheRecordsOfAllServicesCanBeReadWithoutWriting) {
    create({{.service = tidewater, .bundle = "com.example.a", .granted = true},
            {.service = brackwater, .bundle = std::nullopt, .granted = std::nullopt}});
    const auto before = test::treeOf(directory());

    {
        auto database = ConsentDatabase::openForReading(path());
        ASSERT_TRUE(database && *database);
        ConsentDatabase& opened = **database;
        const auto records = opened.allRecords();
        ASSERT_TRUE(records) << records.error();
        ASSERT_EQ(records->size(), 2U);
        EXPECT_EQ(records->front().service, tidewater);
        EXPECT_EQ(records->front().bundle, "com.example.a");
        EXPECT_EQ(records->front().granted, true);
        EXPECT_EQ(records->back().service, brackwater);
        EXPECT_EQ(records->back().bundle, std::nullopt);
        EXPECT_EQ(records->back().granted, std::nullopt);
        EXPECT_EQ(opened.version(), 1);
    }

    EXPECT_EQ(test::treeOf(directory()), before);
}

TEST_F(ConsentDatabaseTest, WhereNoneStandsNoneIsRead) {
    const auto database = ConsentDatabase::openForReading(path());

    ASSERT_TRUE(database);
    EXPECT_FALSE(database->has_value());
    EXPECT_TRUE(std::filesystem::is_empty(directory()));
}

} // namespace
} // namespace nimbra::device
