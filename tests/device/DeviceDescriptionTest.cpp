#include "device/DeviceDescription.h"

#include "device/json/JsonReader.h"

#include <gtest/gtest.h>
#include <string>
#include <utility>
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

std::string problemIn(const std::string& text) {
    const auto reader = JsonReader::parse(text, "FILE");
    EXPECT_TRUE(reader) << reader.error();
    (void)readDeviceDescription(*reader);
    const auto problem = reader->problem();
    return problem ? problem->description : "no problem in " + text;
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
    EXPECT_EQ(std::chrono::system_clock::to_time_t(description.now), 1709647629);
    EXPECT_TRUE(description.cellularData);
    EXPECT_EQ(description.wirelessVariant, std::nullopt);
    EXPECT_TRUE(description.preferences.empty());
    EXPECT_TRUE(description.cloudSyncDenied.empty());
    EXPECT_TRUE(description.appCellularDataModificationAllowed);
    EXPECT_EQ(description.identity, std::nullopt);
    EXPECT_TRUE(description.containers.empty());
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
    EXPECT_EQ(std::chrono::system_clock::to_time_t(description.now), 1709647629);
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
}

TEST(DeviceDescriptionTest, AnEmptyListOfAccountsMeansNone) {
    EXPECT_TRUE(given(R"({"accounts": []})").description.accounts.empty());
}

TEST(DeviceDescriptionTest, PartsThatNothingUsesYetAreCheckedAndNamed) {
    const auto everything = given(R"({
        "name": "x",
        "apps": [{"identifier": "com.a", "name": "A", "removedSystemApp": true,
                  "entitlements": {"key": [1, {}]}, "running": true}, {"identifier": "com.b"}],
        "consent": [{"service": "kPRVServiceTidewater", "bundle": "com.a", "granted": true},
                    {"service": "kPRVServiceBrackwater", "bundle": null, "granted": null},
                    {"service": "kPRVServiceBrackwater"}],
        "deviceList": {"incompatible": ["Old Phone"], "needUpgrade": []},
        "databaseSettings": {"numAppGroups": 3},
        "tool": {"exit": 1, "signal": null, "writesArchive": false},
        "faults": {"save": [null, {"domain": "D", "code": 1, "description": "d"}],
                   "consentSet": [false, null], "removeItem": [], "createDirectory": [null],
                   "spawn": [2, null]}})");
    EXPECT_EQ(
        keysWithoutEffect(everything),
        (Strings{"apps", "consent", "deviceList", "databaseSettings", "tool", "faults/consentSet",
                 "faults/createDirectory", "faults/removeItem", "faults/spawn"}));

    const auto others =
        given(R"({"deviceList": null, "databaseSettings": null, "tool": null, "name": "x"})");
    EXPECT_EQ(keysWithoutEffect(others), (Strings{"deviceList", "databaseSettings", "tool"}));
    EXPECT_EQ(keysWithoutEffect(given(R"({"deviceList": "never", "tool": "real"})")),
              (Strings{"deviceList", "tool"}));
    EXPECT_TRUE(keysWithoutEffect(given(R"({"name": "x", "accounts": []})")).empty());
}

class RejectedDescriptionTest : public testing::TestWithParam<std::pair<std::string, std::string>> {
};

TEST_P(RejectedDescriptionTest, IsReportedWithItsPlace) {
    const auto& [text, message] = GetParam();
    EXPECT_EQ(problemIn(text), "FILE: " + message) << text;
}

const std::string dataclasses =
    R"(expected one of "kAccountDataclassTidewater", "kAccountDataclassLarder", )"
    R"("kAccountDataclassTSYDatabaseService", "kAccountDataclassTSYDeviceService", )"
    R"("kAccountDataclassTSYShareService", "kAccountDataclassKeyValue")";
const std::string name = "expected a string that is not empty, found ";
const std::string nameOrNull = "expected a string that is not empty, or null, found ";
const std::string instant =
    R"(expected an RFC 3339 instant such as "2024-03-05T14:07:09Z", found )";
const std::string tag = R"(expected a BCP 47 language tag such as "de-DE", found )";
const std::string zone = R"(expected the IANA name of a time zone such as "Europe/Berlin", found )";
const std::string error = "expected an error: an object with domain, code and description, found ";

INSTANTIATE_TEST_SUITE_P(
    Device, RejectedDescriptionTest,
    testing::Values(
        std::pair{"[]", "/: expected an object, found []"},
        std::pair{R"({"colour": 1})",
                  "/colour: unknown key; expected one of name, idiom, screen, locale, timeZone, "
                  "now, cellularData, wirelessVariant, preferences, restrictions, accounts, apps, "
                  "consent, documents, deviceList, databaseSettings, tool, strings, "
                  "paneBundleRegistered, faults"},
        std::pair{R"({"name": 7})", "/name: " + name + "7"},
        std::pair{R"({"name": ""})", "/name: " + name + "\"\""},
        std::pair{R"({"idiom": "watch"})",
                  R"(/idiom: expected one of "phone", "pad", found "watch")"},
        std::pair{R"({"idiom": null})", R"(/idiom: expected one of "phone", "pad", found null)"},
        std::pair{R"({"screen": 3})", "/screen: expected an object, found 3"},
        std::pair{R"({"screen": {"depth": 3}})",
                  "/screen/depth: unknown key; expected one of width, height, scale"},
        std::pair{R"({"screen": {"width": 0}})",
                  "/screen/width: expected a number above 0, found 0"},
        std::pair{R"({"screen": {"height": -1.5}})",
                  "/screen/height: expected a number above 0, found -1.5"},
        std::pair{R"({"screen": {"scale": "2"}})",
                  R"(/screen/scale: expected a number, found "2")"},
        std::pair{R"({"locale": "de_DE"})", "/locale: " + tag + "\"de_DE\""},
        std::pair{R"({"locale": ""})", "/locale: " + tag + "\"\""},
        std::pair{R"({"locale": "deutsch-land-ist-zu-lang"})",
                  "/locale: " + tag + "\"deutsch-land-ist-zu-lang\""},
        std::pair{R"({"locale": null})", "/locale: " + tag + "null"},
        std::pair{R"({"timeZone": "Mars/Phobos"})", "/timeZone: " + zone + "\"Mars/Phobos\""},
        std::pair{R"({"timeZone": 1})", "/timeZone: " + zone + "1"},
        std::pair{R"({"now": "2024-03-05"})", "/now: " + instant + "\"2024-03-05\""},
        std::pair{R"({"now": 1709647629})", "/now: " + instant + "1709647629"},
        std::pair{R"({"cellularData": "yes"})",
                  R"(/cellularData: expected true or false, found "yes")"},
        std::pair{R"({"wirelessVariant": ""})", "/wirelessVariant: " + nameOrNull + "\"\""},
        std::pair{R"({"paneBundleRegistered": 0})",
                  "/paneBundleRegistered: expected true or false, found 0"}));

INSTANTIATE_TEST_SUITE_P(
    Parts, RejectedDescriptionTest,
    testing::Values(
        std::pair{R"({"preferences": []})", "/preferences: expected an object, found []"},
        std::pair{R"({"preferences": {"d": 1}})",
                  "/preferences/d: expected an object of keys and values, found 1"},
        std::pair{R"({"preferences": {"a/b": {}}})",
                  R"(/preferences/a~1b: a domain cannot be empty or contain "/" or "..")"},
        std::pair{R"({"preferences": {"..": {}}})",
                  R"(/preferences/..: a domain cannot be empty or contain "/" or "..")"},
        std::pair{R"({"preferences": {"": {}}})",
                  R"(/preferences/: a domain cannot be empty or contain "/" or "..")"},
        std::pair{R"({"restrictions": null})", "/restrictions: expected an object, found null"},
        std::pair{R"({"restrictions": {"x": 1}})",
                  "/restrictions/x: unknown key; expected one of cloudSyncDenied, "
                  "appCellularDataModificationAllowed"},
        std::pair{R"({"restrictions": {"cloudSyncDenied": "com.a"}})",
                  R"(/restrictions/cloudSyncDenied: expected an array, found "com.a")"},
        std::pair{R"({"restrictions": {"cloudSyncDenied": [""]}})",
                  "/restrictions/cloudSyncDenied/0: " + name + "\"\""},
        std::pair{R"({"restrictions": {"appCellularDataModificationAllowed": 1}})",
                  "/restrictions/appCellularDataModificationAllowed: expected true or false, "
                  "found 1"},
        std::pair{R"({"accounts": {}})", "/accounts: expected an array, found {}"},
        std::pair{R"({"accounts": ["a"]})", R"(/accounts/0: expected an object, found "a")"},
        std::pair{R"({"accounts": [{}]})", "/accounts/0/identifier: " + name + "nothing"},
        std::pair{R"({"accounts": [{"identifier": ""}]})",
                  "/accounts/0/identifier: " + name + "\"\""},
        std::pair{R"({"accounts": [{"identifier": "a"}, {"identifier": "a"}]})",
                  R"(/accounts/1/identifier: expected an identifier that no other account has, )"
                  R"(found "a")"},
        std::pair{R"({"accounts": [{"identifier": "a", "owner": 1}]})",
                  "/accounts/0/owner: unknown key; expected one of identifier, primary, "
                  "usesStratafile, enabled, provisioned, cellular, tessaryAccount"},
        std::pair{R"({"accounts": [{"identifier": "a", "primary": null}]})",
                  "/accounts/0/primary: expected true or false, found null"},
        std::pair{R"({"accounts": [{"identifier": "a", "enabled": ["Mail"]}]})",
                  "/accounts/0/enabled/0: " + dataclasses + ", found \"Mail\""},
        std::pair{R"({"accounts": [{"identifier": "a", "cellular": [null]}]})",
                  "/accounts/0/cellular/0: " + dataclasses + ", found null"},
        std::pair{R"({"accounts": [{"identifier": "a", "tessaryAccount": 1}]})",
                  "/accounts/0/tessaryAccount: " + nameOrNull + "1"},
        std::pair{R"({"documents": {"identity": ""}})",
                  "/documents/identity: " + nameOrNull + "\"\""},
        std::pair{R"({"documents": {"container": []}})",
                  "/documents/container: unknown key; expected one of identity, containers, "
                  "lastSyncDate, lastSyncText"},
        std::pair{R"({"documents": {"containers": [{}]}})",
                  "/documents/containers/0/identifier: " + name + "nothing"},
        std::pair{R"({"documents": {"containers": [{"identifier": "c", "public": "no"}]}})",
                  R"(/documents/containers/0/public: expected true or false, found "no")"},
        std::pair{R"({"documents": {"lastSyncDate": "today"}})",
                  "/documents/lastSyncDate: " + instant + "\"today\""},
        std::pair{R"({"documents": {"lastSyncText": 1}})",
                  "/documents/lastSyncText: expected a string, found 1"},
        std::pair{R"({"documents": {"lastSyncText": {}}})",
                  "/documents/lastSyncText/error: " + error + "nothing"},
        std::pair{R"({"documents": {"lastSyncDate": {"error": {"domain": "D"}}}})",
                  "/documents/lastSyncDate/error/code: expected an integer, found nothing"},
        std::pair{R"({"strings": ["x"]})", R"(/strings: expected an object, found ["x"])"},
        std::pair{R"({"strings": {"K": 1}})", "/strings/K: expected a string, found 1"}));

INSTANTIATE_TEST_SUITE_P(
    LaterParts, RejectedDescriptionTest,
    testing::Values(
        std::pair{R"({"apps": {}})", "/apps: expected an array, found {}"},
        std::pair{R"({"apps": [{"name": "A"}]})", "/apps/0/identifier: " + name + "nothing"},
        std::pair{R"({"apps": [{"identifier": "a", "name": 7}]})",
                  "/apps/0/name: expected a string, found 7"},
        std::pair{R"({"apps": [{"identifier": "a", "icon": 7}]})",
                  "/apps/0/icon: unknown key; expected one of identifier, name, "
                  "removedSystemApp, entitlements, running"},
        std::pair{R"({"apps": [{"identifier": "a", "entitlements": []}]})",
                  "/apps/0/entitlements: expected an object, found []"},
        std::pair{R"({"apps": [{"identifier": "a", "running": 1}]})",
                  "/apps/0/running: expected true or false, found 1"},
        std::pair{R"({"consent": [{"service": "kPRVServiceCamera"}]})",
                  R"(/consent/0/service: expected one of "kPRVServiceTidewater", )"
                  R"("kPRVServiceBrackwater", found "kPRVServiceCamera")"},
        std::pair{R"({"consent": [{"service": "kPRVServiceTidewater", "bundle": 1}]})",
                  "/consent/0/bundle: " + nameOrNull + "1"},
        std::pair{R"({"consent": [{"service": "kPRVServiceTidewater", "granted": 1}]})",
                  "/consent/0/granted: expected true, false or null, found 1"},
        std::pair{R"({"deviceList": "always"})",
                  R"(/deviceList: expected an object, null or "never", found "always")"},
        std::pair{R"({"deviceList": {"incompatible": [1]}})",
                  "/deviceList/incompatible/0: expected a string, found 1"},
        std::pair{R"({"databaseSettings": 3})",
                  "/databaseSettings: expected an object or null, found 3"},
        std::pair{R"({"databaseSettings": {"numAppGroups": "many"}})",
                  "/databaseSettings/numAppGroups: expected an integer, "
                  "found \"many\""},
        std::pair{R"({"tool": "fake"})",
                  R"(/tool: expected an object, null or "real", found "fake")"},
        std::pair{R"({"tool": {"exit": 256}})",
                  "/tool/exit: expected an integer from 0 to 255, found 256"},
        std::pair{R"({"tool": {"signal": 0}})",
                  "/tool/signal: expected an integer from 1 to 64, found 0"},
        std::pair{R"({"tool": {"writesArchive": "x"}})",
                  R"(/tool/writesArchive: expected true or false, found "x")"},
        std::pair{R"({"faults": {"load": []}})",
                  "/faults/load: unknown key; expected one of save, consentSet, removeItem, "
                  "createDirectory, spawn"},
        std::pair{R"({"faults": {"save": ["x"]}})", "/faults/save/0: " + error + "\"x\""},
        std::pair{R"({"faults": {"save": [{"domain": "D", "code": 1, "description": 2}]}})",
                  "/faults/save/0/description: expected a string, found 2"},
        std::pair{R"({"faults": {"consentSet": [true]}})",
                  "/faults/consentSet/0: expected false or null, found true"},
        std::pair{R"({"faults": {"spawn": [0]}})",
                  "/faults/spawn/0: expected an integer from 1 to 4095, found 0"}));

} // namespace
} // namespace nimbra::device
