#include "device/DeviceDirectory.h"
#include "device/store/ConsentDatabase.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <gtest/gtest.h>
#include <map>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using test::treeOf;
using test::writeTestFile;

class DeviceDirectoryApplicationsTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::filesystem::path state(const std::string& name) const {
        return root() / "var/lib/nimbra" / name;
    }
    [[nodiscard]] std::filesystem::path applications() const {
        return root() / "usr/share/applications";
    }

    /// The consent for cloud-document storage.
    [[nodiscard]] std::vector<ConsentDatabase::Record> consent() const {
        auto database = ConsentDatabase::open(state("consent.db"));
        EXPECT_TRUE(database && *database);
        return (*database)->records(kPRVServiceTidewater).value();
    }

    /// Consent to cloud-document storage as a description has it.
    [[nodiscard]] static DeviceDescription::ConsentRecord given(const std::string& bundle) {
        return {.service = kPRVServiceTidewater.string(), .bundle = bundle, .granted = true};
    }
    /// The same as the database has it.
    [[nodiscard]] static ConsentDatabase::Record kept(const std::string& bundle) {
        return {.bundle = BundleIdentifier(bundle), .granted = true};
    }

    void create(const DeviceDescription& description = {}) const {
        const auto created = createDeviceDirectory(root(), description);
        ASSERT_TRUE(created) << created.error();
    }

    void apply(const GivenDescription& change) const {
        const auto changed = changeDeviceDirectory(root(), change);
        ASSERT_TRUE(changed) << changed.error();
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceDirectoryApplicationsTest, ApplicationsAndConsentAreKept) {
    DeviceDescription description;
    description.apps = {{.identifier = "com.b", .name = " B\n", .removedSystemApp = true},
                        {.identifier = "com/a", .name = "A", .entitlements = {{"k", "\\"}}}};
    description.consent = {given("z"), {.service = kPRVServiceTidewater.string()}, given("a")};

    create(description);

    EXPECT_EQ(
        treeOf(applications()),
        (std::map<std::string, std::string>{
            {"com.b.desktop", "[Desktop Entry]\nType=Application\nName=\\sB\\n\nHidden=true\n"},
            {"com%2Fa.desktop", "[Desktop Entry]\nType=Application\nName=A\n"
                                "X-Nimbra-Entitlements={\"k\":\"\\\\\\\\\"}\n"}}));
    EXPECT_EQ(consent(), (std::vector<ConsentDatabase::Record>{kept("z"), {}, kept("a")}));
}

TEST_F(DeviceDirectoryApplicationsTest, AnApplicationThatCannotBeKeptLeavesNothing) {
    DeviceDescription description;
    description.apps = {{.identifier = "com.a", .name = "A"},
                        {.identifier = std::string(300, 'x'), .name = "B"}};

    const auto created = createDeviceDirectory(root(), description);

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              (applications() / (std::string(300, 'x') + ".desktop")).string() +
                  ": cannot be written: File name too long");
    EXPECT_TRUE(treeOf(root().parent_path()).empty());
}

TEST_F(DeviceDirectoryApplicationsTest, ChangedApplicationsAndConsentReplaceAllOthers) {
    DeviceDescription description;
    description.apps = {{.identifier = "com.gone", .name = "Gone"},
                        {.identifier = "com.a", .name = "A"}};
    description.consent = {given("com.gone"), given("com.a")};
    create(description);

    GivenDescription change;
    change.keys = {"apps", "consent"};
    change.description.apps = {{.identifier = "com.a", .name = "New"}};
    change.description.consent = {given("com.z"), given("com.b")};
    apply(change);

    EXPECT_EQ(treeOf(applications()),
              (std::map<std::string, std::string>{
                  {"com.a.desktop", "[Desktop Entry]\nType=Application\nName=New\n"}}));
    EXPECT_EQ(consent(), (std::vector{kept("com.z"), kept("com.b")}));
}

TEST_F(DeviceDirectoryApplicationsTest,
       AChangeGivesADeviceOfAnEarlierVersionItsApplicationsAndConsent) {
    create();
    std::filesystem::remove(state("consent.db"));
    std::filesystem::remove_all(root() / "usr");

    GivenDescription change;
    change.keys = {"apps", "consent"};
    change.description.apps = {{.identifier = "com.a", .name = "A"}};
    change.description.consent = {given("com.a")};
    apply(change);

    EXPECT_TRUE(std::filesystem::exists(applications() / "com.a.desktop"));
    EXPECT_EQ(consent(), std::vector{kept("com.a")});
}

TEST_F(DeviceDirectoryApplicationsTest, AChangeOfSomethingElseLeavesThemAsTheyWere) {
    DeviceDescription description;
    description.apps = {{.identifier = "com.a", .name = "A"}};
    description.consent = {given("com.a")};
    create(description);
    const auto entries = treeOf(applications());

    GivenDescription change;
    change.keys = {"name", "accounts"};
    apply(change);

    EXPECT_EQ(treeOf(applications()), entries);
    EXPECT_EQ(consent(), std::vector{kept("com.a")});
}

TEST_F(DeviceDirectoryApplicationsTest, AChangeOfSomethingElseMakesNoConsentDatabase) {
    create();
    std::filesystem::remove(state("consent.db"));

    GivenDescription change;
    change.keys = {"name"};
    apply(change);

    EXPECT_FALSE(std::filesystem::exists(state("consent.db")));
}

TEST_F(DeviceDirectoryApplicationsTest, ADeviceWithADamagedConsentDatabaseIsNotChanged) {
    create();
    writeTestFile(state("consent.db"), std::string(4096, '?'));
    const auto before = treeOf(root());
    GivenDescription change;
    change.keys = {"name", "apps", "consent"};

    const auto changed = changeDeviceDirectory(root(), change);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description,
              state("consent.db").string() + ": not a consent database: file is not a database");
    EXPECT_EQ(treeOf(root()), before);
}

TEST_F(DeviceDirectoryApplicationsTest, ConsentThatCannotBeReplacedIsReportedAndStays) {
    DeviceDescription description;
    description.consent = {given("com.a")};
    create(description);
    SQLite::Database(state("consent.db").string(), SQLite::OPEN_READWRITE)
        .exec("CREATE TRIGGER refusal BEFORE INSERT ON consent "
              "BEGIN SELECT RAISE(ABORT, 'refused'); END");
    GivenDescription change;
    change.keys = {"consent"};
    change.description.consent = {given("com.b")};

    const auto changed = changeDeviceDirectory(root(), change);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description, state("consent.db").string() + ": refused");
    EXPECT_EQ(consent(), std::vector{kept("com.a")});
}

TEST_F(DeviceDirectoryApplicationsTest, ApplicationsThatCannotBeReplacedAreReported) {
    create();
    std::filesystem::create_directories(applications() / "com.a.desktop/taken");
    GivenDescription change;
    change.keys = {"apps"};

    const auto changed = changeDeviceDirectory(root(), change);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description, (applications() / "com.a.desktop").string() +
                                               ": cannot be removed: Directory not empty");
}

} // namespace
} // namespace nimbra::device
