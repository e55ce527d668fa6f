#include "device/DeviceDirectory.h"

#include "device/description/DescriptionFiles.h"
#include "device/store/AccountDatabase.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <set>
#include <string>

namespace nimbra::device {
namespace {

using test::contentOf;
using test::treeOf;
using test::writeTestFile;

class DeviceDirectoryTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path place() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path root() const { return place() / "device"; }
    [[nodiscard]] std::filesystem::path state(const std::string& name) const {
        return root() / "var/lib/nimbra" / name;
    }

    void create(const DeviceDescription& description = {}) const {
        const auto created = createDeviceDirectory(root(), description);
        ASSERT_TRUE(created) << created.error();
    }

    void change(const GivenDescription& given) const {
        const auto changed = changeDeviceDirectory(root(), given);
        ASSERT_TRUE(changed) << changed.error();
    }

    [[nodiscard]] std::vector<AccountIdentifier> accounts() const {
        auto database = AccountDatabase::open(state("accounts.db"));
        EXPECT_TRUE(database) << database.error();
        return database->accountIdentifiers().value();
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceDirectoryTest, EveryPartOfADescriptionGetsItsFile) {
    DeviceDescription description;
    description.name = "Ada's phone";
    description.screen = std::nullopt;
    description.locale = "de-DE";
    description.wirelessVariant = "WAPI";
    description.cloudSyncDenied = {"com.a"};
    description.identity = "token";
    description.containers = {{.identifier = "c", .isPublic = true}};
    description.deviceList = {.incompatible = {"b", "", "\"a\"\n"}, .needUpgrade = {"c"}};
    description.preferences["com.vantrel.marrow"] = {{"log.level", 1}};

    create(description);

    EXPECT_EQ(contentOf(state("device.json")), R"({
  "name": "Ada's phone",
  "idiom": "phone",
  "screen": null,
  "locale": "de-DE",
  "timeZone": "UTC",
  "abilities": {
    "cellularData": true,
    "wirelessVariant": "WAPI"
  }
}
)");
    EXPECT_EQ(contentOf(state("restrictions.json")), R"({
  "cloudSyncDenied": [
    "com.a"
  ],
  "appCellularDataModificationAllowed": true
}
)");
    EXPECT_EQ(contentOf(state("documents.json")), R"({
  "identity": "token",
  "containers": [
    {
      "identifier": "c",
      "public": true,
      "registrationFails": false
    }
  ],
  "lastSyncDate": null,
  "lastSyncText": null
}
)");
    EXPECT_EQ(contentOf(state("device-list.json")), R"({
  "incompatible": [
    "b",
    "",
    "\"a\"\n"
  ],
  "needUpgrade": [
    "c"
  ],
  "outcome": "answers",
  "delay": 0.0
}
)");
    EXPECT_EQ(contentOf(state("preferences/com.vantrel.marrow.json")),
              "{\n  \"log.level\": 1\n}\n");
    EXPECT_EQ(accounts(), std::vector{AccountIdentifier("primary")});
}

TEST_F(DeviceDirectoryTest, ASentenceThatTheDeviceComposesIsLeftOut) {
    DeviceDescription description;
    description.lastSyncDate = "2024-03-05T13:00:00Z";
    description.composesLastSyncText = true;

    create(description);

    EXPECT_EQ(contentOf(state("documents.json")), R"({
  "identity": null,
  "containers": [],
  "lastSyncDate": "2024-03-05T13:00:00Z"
}
)");
    const auto read = readDescriptionFile(DevicePaths(root()), documentsFile);
    ASSERT_TRUE(read) << read.error();
    EXPECT_EQ(read->lastSyncDate, description.lastSyncDate);
    EXPECT_TRUE(read->composesLastSyncText);
}

TEST_F(DeviceDirectoryTest, NothingButTheDeviceIsLeft) {
    create();

    std::set<std::string> names;
    for (const auto& [name, content] : treeOf(place())) {
        names.insert(name);
    }
    const std::string base = "device/var/lib/nimbra";
    EXPECT_EQ(names, (std::set<std::string>{"device", "device/usr", "device/usr/share",
                                            "device/usr/share/applications", "device/var",
                                            "device/var/lib", base, base + "/accounts.db",
                                            base + "/consent.db", base + "/device-list.json",
                                            base + "/device.json", base + "/documents.json",
                                            base + "/preferences", base + "/restrictions.json"}));
}

TEST_F(DeviceDirectoryTest, DirectoriesAboveTheRootAreMade) {
    const auto deep = place() / "a/b/c/";

    const auto created = createDeviceDirectory(deep, {});

    ASSERT_TRUE(created) << created.error();
    EXPECT_TRUE(std::filesystem::exists(deep / "var/lib/nimbra/device.json"));
}

TEST_F(DeviceDirectoryTest, AnEmptyDirectoryIsFilledAndStaysTheSame) {
    std::filesystem::create_directory(root());
    const std::filesystem::path link = place() / "link";
    std::filesystem::create_directory_symlink(root(), link);

    const auto created = createDeviceDirectory(link, {});

    ASSERT_TRUE(created) << created.error();
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(root()), {}), 2);
    EXPECT_TRUE(std::filesystem::exists(state("accounts.db")));
}

TEST_F(DeviceDirectoryTest, ADirectoryThatIsNotEmptyIsLeftAlone) {
    writeTestFile(root() / "letter.txt", "mine");
    const auto before = treeOf(place());

    const auto created = createDeviceDirectory(root(), {});

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              root().string() + ": exists and is not an empty directory");
    EXPECT_EQ(treeOf(place()), before);
}

TEST_F(DeviceDirectoryTest, AFileInThePlaceOfTheRootIsLeftAlone) {
    writeTestFile(root(), "mine");

    const auto created = createDeviceDirectory(root(), {});
    const auto below = createDeviceDirectory(root() / "below", {});

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              root().string() + ": exists and is not an empty directory");
    ASSERT_FALSE(below);
    EXPECT_EQ(below.error().description,
              (root() / "below").string() + ": cannot be made: Not a directory");
    EXPECT_EQ(contentOf(root()), "mine");
}

TEST_F(DeviceDirectoryTest, AFailureOnTheWayLeavesNothing) {
    DeviceDescription description;
    description.preferences[std::string(300, 'x')] = nlohmann::json::object();

    const auto target = place() / "new/device";

    const auto created = createDeviceDirectory(target, description);

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              (target / "var/lib/nimbra/preferences" / (std::string(300, 'x') + ".json")).string() +
                  ": cannot be written: File name too long");
    EXPECT_TRUE(treeOf(place()).empty());
}

TEST_F(DeviceDirectoryTest, AccountsThatCannotBeKeptLeaveNothing) {
    DeviceDescription description;
    description.accounts = {{.identifier = "a"}, {.identifier = "a"}};

    const auto created = createDeviceDirectory(root(), description);

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              state("accounts.db").string() + ": UNIQUE constraint failed: accounts.identifier");
    EXPECT_TRUE(treeOf(place()).empty());
}

TEST_F(DeviceDirectoryTest, AChangeReplacesTheGivenKeysAndNothingElse) {
    DeviceDescription description;
    description.name = "Old";
    description.locale = "fr";
    description.identity = "token";
    description.containers = {{.identifier = "c"}};
    create(description);
    const std::string restrictions = contentOf(state("restrictions.json"));

    GivenDescription given;
    given.keys = {"locale", "cellularData", "documents"};
    given.description.locale = "ja";
    given.description.cellularData = false;
    change(given);

    const auto device = nlohmann::json::parse(contentOf(state("device.json")));
    EXPECT_EQ(device["name"], "Old");
    EXPECT_EQ(device["locale"], "ja");
    EXPECT_EQ(device["abilities"]["cellularData"], false);
    const auto documents = nlohmann::json::parse(contentOf(state("documents.json")));
    EXPECT_TRUE(documents["identity"].is_null());
    EXPECT_TRUE(documents["containers"].empty());
    EXPECT_EQ(contentOf(state("restrictions.json")), restrictions);
    EXPECT_EQ(accounts(), std::vector{AccountIdentifier("primary")});
}

TEST_F(DeviceDirectoryTest, ChangedAccountsReplaceAllOthersInTheirOrder) {
    create();

    GivenDescription given;
    given.keys = {"accounts"};
    given.description.accounts = {{.identifier = "z"}, {.identifier = "a"}};
    change(given);

    EXPECT_EQ(accounts(), (std::vector{AccountIdentifier("z"), AccountIdentifier("a")}));
}

TEST_F(DeviceDirectoryTest, ChangedPreferencesReplaceAllDomains) {
    DeviceDescription description;
    description.preferences["old"] = {{"k", 1}};
    description.preferences["both"] = {{"k", 1}, {"gone", 2}};
    create(description);

    GivenDescription given;
    given.keys = {"preferences", "restrictions"};
    given.description.preferences["both"] = {{"k", 3}};
    given.description.preferences["new"] = {{"k", 4}};
    given.description.cloudSyncDenied = {"com.b"};
    change(given);

    EXPECT_EQ(treeOf(state("preferences")),
              (std::map<std::string, std::string>{{"both.json", "{\n  \"k\": 3\n}\n"},
                                                  {"new.json", "{\n  \"k\": 4\n}\n"}}));
    EXPECT_TRUE(contentOf(state("restrictions.json")).contains("com.b"));
}

TEST_F(DeviceDirectoryTest, ADeviceWithADamagedFileIsNotChanged) {
    create();
    writeTestFile(state("device.json"), "{");
    const auto before = treeOf(place());
    GivenDescription given;
    given.keys = {"documents", "accounts", "name"};

    const auto changed = changeDeviceDirectory(root(), given);

    ASSERT_FALSE(changed);
    EXPECT_TRUE(changed.error().description.starts_with(state("device.json").string() +
                                                        ": line 1, column 2: not JSON"))
        << changed.error();
    EXPECT_EQ(treeOf(place()), before);
}

TEST_F(DeviceDirectoryTest, AnEmptyNameMakesNoDevice) {
    const auto created = createDeviceDirectory("", {});

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description, "the name of a directory is empty");
}

TEST_F(DeviceDirectoryTest, APartThatCannotBeWrittenIsReported) {
    create();
    std::filesystem::remove(state("restrictions.json"));
    std::filesystem::create_directories(state("restrictions.json") / "taken");
    GivenDescription given;
    given.keys = {"restrictions"};

    const auto changed = changeDeviceDirectory(root(), given);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description,
              state("restrictions.json").string() + ": cannot be written: Is a directory");
}

TEST_F(DeviceDirectoryTest, PreferencesThatCannotBeReplacedAreReported) {
    create();
    std::filesystem::create_directories(state("preferences/old.json/taken"));
    GivenDescription given;
    given.keys = {"preferences"};

    const auto changed = changeDeviceDirectory(root(), given);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description,
              state("preferences/old.json").string() + ": cannot be removed: Directory not empty");
}

} // namespace
} // namespace nimbra::device
