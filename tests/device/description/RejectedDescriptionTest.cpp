#include "device/DeviceDescription.h"
#include "device/json/JsonReader.h"

#include <gtest/gtest.h>
#include <string>
#include <utility>

namespace nimbra::device {
namespace {

std::string problemIn(const std::string& text) {
    const auto reader = JsonReader::parse(text, "FILE");
    EXPECT_TRUE(reader) << reader.error();
    (void)readDeviceDescription(*reader);
    const auto problem = reader->problem();
    return problem ? problem->description : "no problem in " + text;
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
        std::pair{R"({"strings": {"K": 1}})", "/strings/K: expected a string, found 1"},
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
        std::pair{R"({"consent": [{"bundle": "a"}]})", "/consent/0/service: " + name + "nothing"},
        std::pair{
            R"({"apps": [{"identifier": ")" + std::string(248, 'a') + R"("}]})",
            "/apps/0/identifier: expected an identifier short enough to name a file, found \"" +
                std::string(59, 'a') + "..."},
        std::pair{R"({"consent": [{"service": "kPRVServiceTidewater", "bundle": 1}]})",
                  "/consent/0/bundle: " + nameOrNull + "1"},
        std::pair{R"({"consent": [{"service": "kPRVServiceTidewater", "granted": 1}]})",
                  "/consent/0/granted: expected true, false or null, found 1"},
        std::pair{R"({"apps": [{"identifier": "a"}, {"identifier": "b"}, {"identifier": "a"}]})",
                  R"(/apps/2/identifier: expected an identifier that no other application has, )"
                  R"(found "a")"}));

INSTANTIATE_TEST_SUITE_P(
    DeviceList, RejectedDescriptionTest,
    testing::Values(
        std::pair{R"({"deviceList": "always"})",
                  R"(/deviceList: expected an object, null or "never", found "always")"},
        std::pair{R"({"deviceList": {"incompatible": [1]}})",
                  "/deviceList/incompatible/0: expected a string, found 1"},
        std::pair{R"({"deviceList": []})",
                  R"(/deviceList: expected an object, null or "never", found [])"},
        std::pair{R"({"deviceList": {"needUpgrade": "a"}})",
                  R"(/deviceList/needUpgrade: expected an array, found "a")"},
        std::pair{R"({"deviceList": {"needUpgrade": [null]}})",
                  "/deviceList/needUpgrade/0: expected a string, found null"},
        std::pair{R"({"deviceList": {"outcome": "fails"}})",
                  "/deviceList/outcome: unknown key; expected one of incompatible, needUpgrade"},
        std::pair{R"({"deviceList": {"delay": 1}})",
                  "/deviceList/delay: unknown key; expected one of incompatible, needUpgrade"}));

INSTANTIATE_TEST_SUITE_P(
    DatabaseSettings, RejectedDescriptionTest,
    testing::Values(std::pair{R"({"databaseSettings": 3})",
                              "/databaseSettings: expected an object or null, found 3"},
                    std::pair{R"({"databaseSettings": {"numAppGroups": "many"}})",
                              "/databaseSettings/numAppGroups: expected an integer, "
                              "found \"many\""},
                    std::pair{R"({"databaseSettings": {"numAppGroups": 9223372036854775808}})",
                              "/databaseSettings/numAppGroups: expected an integer, "
                              "found 9223372036854775808"},
                    std::pair{R"({"databaseSettings": {"groups": 1}})",
                              "/databaseSettings/groups: unknown key; expected one of "
                              "numAppGroups"}));

INSTANTIATE_TEST_SUITE_P(
    Tool, RejectedDescriptionTest,
    testing::Values(
        std::pair{R"({"tool": "fake"})",
                  R"(/tool: expected an object, null or "real", found "fake")"},
        std::pair{R"({"tool": true})", R"(/tool: expected an object, null or "real", found true)"},
        std::pair{R"({"tool": {"exit": 256}})",
                  "/tool/exit: expected an integer from 0 to 255, found 256"},
        std::pair{R"({"tool": {"exit": "1"}})", R"(/tool/exit: expected an integer, found "1")"},
        std::pair{R"({"tool": {"signal": 0}})",
                  "/tool/signal: expected an integer from 1 to 64, found 0"},
        std::pair{R"({"tool": {"signal": 65}})",
                  "/tool/signal: expected an integer from 1 to 64, found 65"},
        std::pair{R"({"tool": {"signal": 19}})",
                  "/tool/signal: expected a signal that ends a program, found 19"},
        std::pair{R"({"tool": {"writesArchive": "x"}})",
                  R"(/tool/writesArchive: expected true or false, found "x")"},
        std::pair{R"({"tool": {"path": "x"}})",
                  "/tool/path: unknown key; expected one of exit, signal, writesArchive"}));

INSTANTIATE_TEST_SUITE_P(
    Faults, RejectedDescriptionTest,
    testing::Values(
        std::pair{R"({"faults": {"load": []}})",
                  "/faults/load: unknown key; expected one of save, consentSet, removeItem, "
                  "createDirectory, spawn"},
        std::pair{R"({"faults": {"save": ["x"]}})", "/faults/save/0: " + error + "\"x\""},
        std::pair{R"({"faults": {"save": [{"domain": "D", "code": 1, "description": 2}]}})",
                  "/faults/save/0/description: expected a string, found 2"},
        std::pair{R"({"faults": {"consentSet": [true]}})",
                  "/faults/consentSet/0: expected false or null, found true"},
        std::pair{R"({"faults": {"removeItem": {}}})",
                  "/faults/removeItem: expected an array, found {}"},
        std::pair{R"({"faults": {"removeItem": [null, 2]}})",
                  "/faults/removeItem/1: " + error + "2"},
        std::pair{R"({"faults": {"createDirectory": [{"domain": "D", "description": ""}]}})",
                  "/faults/createDirectory/0/code: expected an integer, found nothing"},
        std::pair{R"({"faults": {"spawn": [0]}})",
                  "/faults/spawn/0: expected an integer from 1 to 4095, found 0"},
        std::pair{R"({"faults": {"spawn": ["ENOENT"]}})",
                  R"(/faults/spawn/0: expected an integer, found "ENOENT")"}));

} // namespace
} // namespace nimbra::device
