#include "device/DeviceDescription.h"

#include "device/json/JsonReader.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using Strings = std::vector<std::string>;

GivenDescription given(const std::string& text) {
    const auto reader = JsonReader::parse(text, "FILE");
    EXPECT_TRUE(reader) << reader.error();
    GivenDescription description = readDeviceDescription(*reader);
    EXPECT_FALSE(reader->problem()) << *reader->problem();
    return description;
}

TEST(DeviceDescriptionTest, ADeviceThatNobodyDescribedHasTheDefaults) {
    const auto [description, keys] = given("{}");

    EXPECT_TRUE(keys.empty());
    EXPECT_EQ(description.name, "Nimbra Phone");
    EXPECT_EQ(description.idiom, "phone");
    ASSERT_TRUE(description.screen);
    EXPECT_EQ(description.screen->width, 390);
    EXPECT_EQ(description.screen->height, 844);
    EXPECT_EQ(description.screen->scale, 2);
    EXPECT_EQ(description.locale, "en-US");
    EXPECT_EQ(description.timeZone, "UTC");
    EXPECT_EQ(description.now, Date(std::chrono::seconds(1709647629)));
    EXPECT_TRUE(description.cellularData);
    EXPECT_EQ(description.wirelessVariant, std::nullopt);
    EXPECT_TRUE(description.apps.empty());
    EXPECT_TRUE(description.consent.empty());
    EXPECT_TRUE(description.consentSetFaults.empty());
    EXPECT_TRUE(description.preferences.empty());
    EXPECT_TRUE(description.cloudSyncDenied.empty());
    EXPECT_TRUE(description.appCellularDataModificationAllowed);
    EXPECT_EQ(description.identity, std::nullopt);
    EXPECT_TRUE(description.containers.empty());
    EXPECT_TRUE(description.deviceList.incompatible.empty());
    EXPECT_TRUE(description.deviceList.needUpgrade.empty());
    EXPECT_EQ(description.deviceList.outcome, DeviceDescription::DeviceList::Outcome::answers);
    EXPECT_EQ(description.deviceList.delay, 0);
    EXPECT_EQ(description.strings, std::nullopt);
    EXPECT_TRUE(description.paneBundleRegistered);

    ASSERT_EQ(description.accounts.size(), 1U);
    const auto& account = description.accounts.front();
    EXPECT_EQ(account.identifier, "primary");
    EXPECT_TRUE(account.primary);
    EXPECT_TRUE(account.usesStratafile);
    EXPECT_TRUE(account.enabled.empty());
    EXPECT_TRUE(account.provisioned.empty());
    EXPECT_TRUE(account.cellular.empty());
    EXPECT_EQ(account.tessaryAccount, std::nullopt);
}

TEST(DeviceDescriptionTest, EveryPartIsRead) {
    const auto [description, keys] = given(R"({
        "name": "Pad", "idiom": "pad", "screen": {"width": 820, "height": 1180.5},
        "locale": "zh-Hant-TW", "timeZone": "Asia/Tokyo", "now": "2024-03-05T15:07:09+01:00",
        "cellularData": false, "wirelessVariant": "WAPI",
        "preferences": {"com.vantrel.marrow": {"log.level": 1, "other": ["x"]}},
        "restrictions": {"cloudSyncDenied": ["com.a"],
                         "appCellularDataModificationAllowed": false},
        "accounts": [{"identifier": "second",
                      "enabled": ["kAccountDataclassTidewater", "kAccountDataclassLarder"],
                      "provisioned": ["kAccountDataclassKeyValue"],
                      "cellular": ["kAccountDataclassTSYShareService"],
                      "tessaryAccount": "primary"},
                     {"identifier": "primary", "primary": true, "usesStratafile": true}],
        "documents": {"identity": "token",
                      "containers": [{"identifier": "c1", "public": true},
                                     {"identifier": "c2", "registrationFails": true}],
                      "lastSyncDate": "2024-03-05T13:00:00Z",
                      "lastSyncText": {"error": {"domain": "D", "code": 3, "description": ""}}},
        "strings": {"KEY": "text"}, "paneBundleRegistered": false})");

    EXPECT_EQ(keys.size(), 14U);
    EXPECT_EQ(description.name, "Pad");
    EXPECT_EQ(description.idiom, "pad");
    ASSERT_TRUE(description.screen);
    EXPECT_EQ(description.screen->width, 820);
    EXPECT_EQ(description.screen->height, 1180.5);
    EXPECT_EQ(description.screen->scale, 2);
    EXPECT_EQ(description.locale, "zh-Hant-TW");
    EXPECT_EQ(description.timeZone, "Asia/Tokyo");
    EXPECT_EQ(description.now, Date(std::chrono::seconds(1709647629)));
    EXPECT_FALSE(description.cellularData);
    EXPECT_EQ(description.wirelessVariant, "WAPI");
    EXPECT_EQ(description.preferences.at("com.vantrel.marrow").dump(),
              R"({"log.level":1,"other":["x"]})");
    EXPECT_EQ(description.cloudSyncDenied, std::set<std::string>{"com.a"});
    EXPECT_FALSE(description.appCellularDataModificationAllowed);
    EXPECT_EQ(description.identity, "token");
    ASSERT_EQ(description.containers.size(), 2U);
    EXPECT_EQ(description.containers[0].identifier, "c1");
    EXPECT_TRUE(description.containers[0].isPublic);
    EXPECT_FALSE(description.containers[0].registrationFails);
    EXPECT_FALSE(description.containers[1].isPublic);
    EXPECT_TRUE(description.containers[1].registrationFails);
    EXPECT_EQ(description.lastSyncDate, "2024-03-05T13:00:00Z");
    EXPECT_EQ(description.lastSyncText["error"]["code"], 3);
    EXPECT_EQ(description.strings, (std::map<std::string, std::string>{{"KEY", "text"}}));
    EXPECT_FALSE(description.paneBundleRegistered);

    ASSERT_EQ(description.accounts.size(), 2U);
    const auto& second = description.accounts[0];
    EXPECT_EQ(second.identifier, "second");
    EXPECT_FALSE(second.primary);
    EXPECT_FALSE(second.usesStratafile);
    EXPECT_EQ(second.enabled,
              (std::set<std::string>{"kAccountDataclassLarder", "kAccountDataclassTidewater"}));
    EXPECT_EQ(second.provisioned, std::set<std::string>{"kAccountDataclassKeyValue"});
    EXPECT_EQ(second.cellular, std::set<std::string>{"kAccountDataclassTSYShareService"});
    EXPECT_EQ(second.tessaryAccount, "primary");
    EXPECT_TRUE(description.accounts[1].primary);
    EXPECT_TRUE(description.accounts[1].usesStratafile);
}

TEST(DeviceDescriptionTest, NullMeansNoScreenNoVariantAndNoIdentity) {
    const auto [description, keys] = given(
        R"({"screen": null, "wirelessVariant": null,
            "documents": {"identity": null, "lastSyncDate": null, "lastSyncText": null}})");

    EXPECT_EQ(description.screen, std::nullopt);
    EXPECT_EQ(description.wirelessVariant, std::nullopt);
    EXPECT_EQ(description.identity, std::nullopt);
    EXPECT_TRUE(description.lastSyncDate.is_null());
    EXPECT_TRUE(description.lastSyncText.is_null());
    EXPECT_FALSE(description.composesLastSyncText);
}

TEST(DeviceDescriptionTest, ASentenceOfTheLastSyncThatIsLeftOutIsComposedButInAScenario) {
    const std::string text = R"({"documents": {"lastSyncDate": "2024-03-05T13:00:00Z"}})";
    const auto reader = JsonReader::parse(text, "scenario");
    ASSERT_TRUE(reader);

    EXPECT_TRUE(given(text).description.composesLastSyncText);
    EXPECT_FALSE(readScenarioDevice(*reader).description.composesLastSyncText);
    EXPECT_FALSE(given("{}").description.composesLastSyncText);
}

TEST(DeviceDescriptionTest, AnEmptyListOfAccountsMeansNone) {
    EXPECT_TRUE(given(R"({"accounts": []})").description.accounts.empty());
}

TEST(DeviceDescriptionTest, ApplicationsAreReadWithEntitlementsAsTheyWereTyped) {
    const auto [description, keys] = given(R"({"apps": [
        {"identifier": "com.a", "name": "  A\n", "removedSystemApp": true, "running": true,
         "entitlements": {"number": 1, "text": "1", "fraction": 1.0, "flag": true, "none": null,
                          "list": [1, {"b": "\\\""}]}},
        {"identifier": "com.b", "name": ""}, {"identifier": "com.c"}]})");

    ASSERT_EQ(description.apps.size(), 3U);
    const auto& first = description.apps[0];
    EXPECT_EQ(first.identifier, "com.a");
    EXPECT_EQ(first.name, "  A\n");
    EXPECT_TRUE(first.removedSystemApp);
    EXPECT_TRUE(first.running);
    EXPECT_EQ(first.entitlements.dump(),
              R"({"flag":true,"fraction":1.0,"list":[1,{"b":"\\\""}],"none":null,"number":1,)"
              R"("text":"1"})");
    EXPECT_EQ(description.apps[1].name, "com.b");
    const auto& last = description.apps[2];
    EXPECT_EQ(last.name, "com.c");
    EXPECT_FALSE(last.removedSystemApp);
    EXPECT_FALSE(last.running);
    EXPECT_EQ(last.entitlements, nlohmann::json::object());
    EXPECT_EQ(keys, std::set<std::string>{"apps"});
}

TEST(DeviceDescriptionTest, ConsentIsReadInItsOrderWithWhatIsLacking) {
    const auto description = given(R"({"consent": [
        {"service": "kPRVServiceTidewater", "bundle": "z", "granted": true},
        {"service": "kPRVServiceBrackwater", "bundle": null, "granted": false},
        {"service": "kPRVServiceTidewater", "bundle": "z", "granted": null},
        {"service": "kPRVServiceTidewater"}]})")
                                 .description;

    ASSERT_EQ(description.consent.size(), 4U);
    EXPECT_EQ(description.consent[0].service, "kPRVServiceTidewater");
    EXPECT_EQ(description.consent[0].bundle, "z");
    EXPECT_EQ(description.consent[0].granted, true);
    EXPECT_EQ(description.consent[1].service, "kPRVServiceBrackwater");
    EXPECT_EQ(description.consent[1].bundle, std::nullopt);
    EXPECT_EQ(description.consent[1].granted, false);
    EXPECT_EQ(description.consent[2].bundle, "z");
    EXPECT_EQ(description.consent[2].granted, std::nullopt);
    EXPECT_EQ(description.consent[3].bundle, std::nullopt);
    EXPECT_EQ(description.consent[3].granted, std::nullopt);
}

TEST(DeviceDescriptionTest, TheListOfDevicesIsReadInItsOrder) {
    const auto list = given(R"({"deviceList": {"incompatible": ["b", "", "a", "b"],
                                               "needUpgrade": [" {0}\n "]}})")
                          .description.deviceList;
    const auto onlyOne = given(R"({"deviceList": {"needUpgrade": ["x"]}})").description.deviceList;

    EXPECT_EQ(list.incompatible, (Strings{"b", "", "a", "b"}));
    EXPECT_EQ(list.needUpgrade, Strings{" {0}\n "});
    EXPECT_EQ(list.outcome, DeviceDescription::DeviceList::Outcome::answers);
    EXPECT_TRUE(onlyOne.incompatible.empty());
    EXPECT_EQ(onlyOne.needUpgrade, Strings{"x"});
}

TEST(DeviceDescriptionTest, AListOfDevicesMayFailOrNeverCome) {
    using Outcome = DeviceDescription::DeviceList::Outcome;

    EXPECT_EQ(given(R"({"deviceList": null})").description.deviceList.outcome, Outcome::fails);
    EXPECT_EQ(given(R"({"deviceList": "never"})").description.deviceList.outcome,
              Outcome::neverAnswers);
    EXPECT_EQ(given(R"({"deviceList": {}})").description.deviceList.outcome, Outcome::answers);
    EXPECT_EQ(given(R"({"deviceList": null})").keys, std::set<std::string>{"deviceList"});
}

TEST(DeviceDescriptionTest, FaultsAreReadInTheirOrder) {
    const auto description = given(R"({"faults": {
        "save": [null, {"domain": "D", "code": 1, "description": "d"}],
        "consentSet": [false, null, false],
        "removeItem": [{"domain": "PlatformErrorDomain", "code": 4, "description": "r"}, null],
        "createDirectory": [null, {"domain": "C", "code": -1, "description": ""}],
        "spawn": [2, null, 4095]}})")
                                 .description;

    using Errors = std::vector<std::optional<Error>>;
    EXPECT_EQ(description.saveFaults,
              (Errors{std::nullopt, Error{.domain = "D", .code = 1, .description = "d"}}));
    EXPECT_EQ(description.consentSetFaults,
              (std::vector<std::optional<bool>>{false, std::nullopt, false}));
    EXPECT_EQ(description.removeItemFaults,
              (Errors{Error{.domain = "PlatformErrorDomain", .code = 4, .description = "r"},
                      std::nullopt}));
    EXPECT_EQ(description.createDirectoryFaults,
              (Errors{std::nullopt, Error{.domain = "C", .code = -1, .description = ""}}));
    EXPECT_EQ(description.spawnFaults, (std::vector<std::optional<int>>{2, std::nullopt, 4095}));
}

TEST(DeviceDescriptionTest, FaultsThatAreNotGivenAreNone) {
    const auto description = given(R"({"faults": {"spawn": []}})").description;

    EXPECT_TRUE(description.saveFaults.empty());
    EXPECT_TRUE(description.consentSetFaults.empty());
    EXPECT_TRUE(description.removeItemFaults.empty());
    EXPECT_TRUE(description.createDirectoryFaults.empty());
    EXPECT_TRUE(description.spawnFaults.empty());
}

TEST(DeviceDescriptionTest, TheToolIsRealMissingOrDoesAsItIsTold) {
    using Kind = DeviceDescription::Tool::Kind;
    const auto tool = [](const std::string& text) {
        return given(R"({"tool": )" + text + "}").description.tool;
    };

    EXPECT_EQ(given("{}").description.tool.kind, Kind::real);
    EXPECT_EQ(tool(R"("real")").kind, Kind::real);
    EXPECT_EQ(tool("null").kind, Kind::missing);

    const auto least = tool("{}");
    EXPECT_EQ(least.kind, Kind::standIn);
    EXPECT_EQ(least.exitStatus, 0);
    EXPECT_EQ(least.signal, std::nullopt);
    EXPECT_FALSE(least.writesArchive);

    const auto most = tool(R"({"exit": 255, "signal": 64, "writesArchive": true})");
    EXPECT_EQ(most.kind, Kind::standIn);
    EXPECT_EQ(most.exitStatus, 255);
    EXPECT_EQ(most.signal, 64);
    EXPECT_TRUE(most.writesArchive);
    EXPECT_EQ(tool(R"({"signal": null})").signal, std::nullopt);
}

TEST(DeviceDescriptionTest, TheDatabasesSettingsHaveANumberOrAreNotThere) {
    const auto settings = [](const std::string& text) {
        return given(R"({"databaseSettings": )" + text + "}").description.databaseSettings;
    };

    EXPECT_FALSE(given("{}").description.databaseSettings);
    EXPECT_FALSE(settings("null"));
    EXPECT_EQ(settings("{}").value().numAppGroups, 0);
    EXPECT_EQ(settings(R"({"numAppGroups": -2})").value().numAppGroups, -2);
    EXPECT_EQ(settings(R"({"numAppGroups": 2147483648})").value().numAppGroups, 2147483648);
}

} // namespace
} // namespace nimbra::device
