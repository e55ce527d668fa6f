#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "tests/device/TestFiles.h"
#include "tests/device/apps/ChildProcess.h"
#include "tests/tools/mrctl/Diagnosis.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <algorithm>
#include <gtest/gtest.h>
#include <random>

namespace nimbra::test {
namespace {

using device::DeviceDescription;
using Json = nlohmann::json;

constexpr auto logFile = "/var/log/nimbra/settings.log";

/// A device with a secret in every place that a report draws from.
class PlantedDevice {
public:
    PlantedDevice() {
        DeviceDescription description;
        description.name = secret("Zo\u00eb\u2019s Pad ");
        description.accounts = {{.identifier = secret("ann.") + "@example.com",
                                 .primary = true,
                                 .enabled = {"class " + secret("token=")},
                                 .tessaryAccount = secret("tessary ")}};
        description.identity = secret("identity ");
        description.containers = {{.identifier = secret("container.")},
                                  {.identifier = secret("日記")}};
        description.lastSyncDate = {
            {"error", {{"domain", "POSIX"}, {"code", 2}, {"description", "at " + path()}}}};
        description.lastSyncText = secret("Synced by ");
        description.deviceList.incompatible = {secret("Attic ")};
        description.deviceList.needUpgrade = {secret("Work's \"Phone\" ")};
        description.wirelessVariant = "password: " + secret("");
        description.cloudSyncDenied = {secret("") + "@example.org"};
        description.consent = {
            {.service = secret("bob") + "@example.com", .bundle = secret("cat") + "@example.com"}};
        description.preferences = {
            {"com.example.mail",
             {{"userName", secret("user ")},
              {"note", "call " + secret("dan") + "@example.com or " + path()},
              {"authToken", {{"deep", {secret("")}}}},
              {secret("key") + "@example.com", 1},
              {"url", "https://ann:" + secret("") + "@example.com/" + unguessable()},
              {"embedded", R"({"secretKey": ")" + secret("") + R"("})"},
              {"named", "of " + description.name + " and " + description.containers[1].identifier},
              {"hex", hexadecimal()}}},
            {secret("eve") + "@example.com", {{"a", 1}}}};
        diagnosis.make(description);
        diagnosis.write("/run/nimbra/progress/" + secret("Tax ") + ".json",
                        Json{{"fraction", 0.5},
                             {"description", secret("Uploading ")},
                             {"additional", secret("of ")},
                             {"fileOperationKind", "see " + path()}}
                            .dump());
        diagnosis.write("/run/nimbra/progress/broken.json",
                        R"({"description": {"of": ")" + unguessable() + R"("}})");
        std::string log;
        for (const std::string& value : std::vector(_known)) {
            log += "2024-03-05T13:00:00.000+0000 error: saw " + value + ", x" + value + "y\n";
        }
        log += "password=" + secret("") + " Bearer " + secret("") + " at " + path() + ": gone\n";
        log += "key " + hexadecimal() + " of " + secret("gus") + "@example.com \xff\n";
        diagnosis.write(logFile, log);
    }

    Diagnosis diagnosis;
    [[nodiscard]] const std::vector<std::string>& secrets() const { return _secrets; }

private:
    /// Something that nobody could guess, behind `start`: a whole value, which the log has as well.
    std::string secret(const std::string& start) {
        _known.push_back(start + unguessable());
        return _known.back();
    }
    /// Something that nobody could guess, in a text that tells what it is.
    std::string unguessable() {
        constexpr std::string_view letters = "bcdfghjkmnpqrstvwxz23456789";
        // Letters alone could be a word of the system's.
        std::string value = "7";
        for (int count = 0; count < 13; ++count) {
            value += letters[_random() % letters.size()];
        }
        _secrets.push_back(value);
        return value;
    }
    std::string hexadecimal() {
        std::string value = "7";
        for (int count = 0; count < 31; ++count) {
            value += "0123456789abcdef"[_random() % 16];
        }
        _secrets.push_back(value);
        return value;
    }
    std::string path() { return "/home" + ('/' + secret("ann")) + "/My " + unguessable() + ".pdf"; }

    /// The same each time, so that what is found once can be looked at.
    std::mt19937 _random;
    std::vector<std::string> _secrets;
    std::vector<std::string> _known;
};

void expectNone(const std::vector<std::string>& secrets, const std::string& text,
                const std::string& place) {
    for (const std::string& secret : secrets) {
        EXPECT_EQ(text.find(secret), std::string::npos) << secret << " in " << place << '\n'
                                                        << text;
    }
}

TEST(DiagnoseTest, NoPlantedSecretIsInTheArchive) {
    const PlantedDevice planted;

    const auto files = planted.diagnosis.files();

    ASSERT_TRUE(files.contains("log.txt"));
    expectNone(planted.secrets(), contentOf(planted.diagnosis.archive()), "the archive");
    for (const auto& [name, content] : files) {
        expectNone(planted.secrets(), name, "a name");
        expectNone(planted.secrets(), content, name);
        EXPECT_EQ(content.find(planted.diagnosis.root().string()), std::string::npos) << name;
    }
}

TEST(DiagnoseTest, PseudonymsAreTheSameThroughoutAnArchive) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.name = "Ann's Pad";
    description.accounts = {{.identifier = "ann@example.com", .tessaryAccount = "ann@example.com"}};
    description.deviceList.needUpgrade = {"Work Phone", "Ann's Pad"};
    description.preferences = {
        {"com.example.a", {{"text", "Ann's Pad of ann@example.com, Work Phone"}}}};
    diagnosis.make(description);
    diagnosis.write(logFile, "Ann's Pad: ann@example.com\n");

    const auto files = diagnosis.files();

    const std::string pad = Json::parse(files.at("device.json")).at("name");
    const std::string ann = Json::parse(files.at("accounts.json")).at(0).at("account");
    const std::string work = Json::parse(files.at("device-list.json")).at("needUpgrade").at(0);
    EXPECT_TRUE(pad.starts_with("device-"));
    EXPECT_TRUE(ann.starts_with("account-"));
    EXPECT_EQ(Json::parse(files.at("accounts.json")).at(0).at("tessaryAccount"), ann);
    EXPECT_EQ(Json::parse(files.at("device-list.json")).at("needUpgrade").at(1), pad);
    EXPECT_EQ(Json::parse(files.at("preferences/com.example.a.json")).at("text"),
              pad + " of " + ann + ", " + work);
    EXPECT_EQ(files.at("log.txt"), pad + ": " + ann + '\n');
}

TEST(DiagnoseTest, WhatHelpsToFindAFaultStaysReadable) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.idiom = "pad";
    description.timeZone = "Europe/Berlin";
    description.accounts = {{.identifier = "ann",
                             .primary = true,
                             .usesStratafile = true,
                             .enabled = {"kAccountDataclassTidewater"},
                             .provisioned = {"kAccountDataclassMail"},
                             .cellular = {"kAccountDataclassTidewater"}}};
    description.containers = {{.identifier = "com.example.notes", .isPublic = true}};
    description.lastSyncDate = "2024-03-05T13:00:00Z";
    description.apps = {{.identifier = "com.example.notes", .name = "Notes"},
                        {.identifier = "com.example.stocks", .removedSystemApp = true}};
    description.consent = {
        {.service = "kPRVServiceTidewater", .bundle = "com.example.notes", .granted = true}};
    description.cloudSyncDenied = {"com.example.work"};
    description.preferences = {{"com.vantrel.marrow", {{"log.level", 7}}}};
    diagnosis.make(description);
    const ChildProcess child;
    diagnosis.write(
        "/run/nimbra/com.example.notes.pid",
        device::ProcessRecord{.process = child.number(),
                              .startTime = device::Process::withNumber(child.number())->startTime()}
            .text());

    const auto files = diagnosis.files();
    const auto json = [&files](const char* name) { return Json::parse(files.at(name)); };

    EXPECT_EQ(json("device.json").at("idiom"), "pad");
    EXPECT_EQ(json("device.json").at("timeZone"), "Europe/Berlin");
    EXPECT_EQ(json("accounts.json"), Json::parse(R"([{"account": "account-1", "primary": true,
        "usesStratafile": true, "enabled": ["kAccountDataclassTidewater"],
        "provisioned": ["kAccountDataclassMail"], "cellular": ["kAccountDataclassTidewater"],
        "tessaryAccount": null}])"));
    EXPECT_EQ(json("documents.json"), Json::parse(R"({"identity": null,
        "containers": [{"container": "container-1", "public": true, "registrationFails": false}],
        "lastSyncDate": "2024-03-05T13:00:00Z", "lastSyncText": null})"));
    EXPECT_EQ(json("applications.json"), Json::parse(R"([
        {"identifier": "com.example.notes", "hidden": false, "running": true},
        {"identifier": "com.example.stocks", "hidden": true, "running": false}])"));
    EXPECT_EQ(json("consent.json"), Json::parse(R"([{"service": "kPRVServiceTidewater",
        "bundle": "com.example.notes", "granted": true}])"));
    EXPECT_EQ(json("restrictions.json").at("cloudSyncDenied"), Json{"com.example.work"});
    EXPECT_EQ(json("preferences/com.vantrel.marrow.json"), Json::parse(R"({"log.level": 7})"));
    EXPECT_EQ(json("versions.json").at("mrctl"), NIMBRA_VERSION);
    EXPECT_EQ(json("versions.json").at("databases"),
              Json::parse(R"({"accounts": 1, "consent": 1})"));
    EXPECT_EQ(files.at("problems.txt").find("accounts"), std::string::npos);
}

TEST(DiagnoseTest, TheManifestListsEveryFileAndWhatWasReplaced) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.accounts = {{.identifier = "ann@example.com"}, {.identifier = "bob@example.com"}};
    diagnosis.make(description);

    const auto files = diagnosis.files();

    const std::string& manifest = files.at("MANIFEST");
    for (const auto& [name, content] : files) {
        if (name != "MANIFEST") {
            const std::string line = "  " + name + "  " + std::to_string(content.size()) + "  ";
            EXPECT_NE(manifest.find(line), std::string::npos) << line << '\n' << manifest;
        }
    }
    EXPECT_NE(manifest.find("  account  values: 2  places: 2\n"), std::string::npos) << manifest;
}

TEST(DiagnoseTest, TheNewestLinesOfTheLogAreThere) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    const auto lines = [](int first, int count) {
        std::string text;
        for (int number = first; number < first + count; ++number) {
            text += "line " + std::to_string(number) + '\n';
        }
        return text;
    };
    diagnosis.write("/var/log/nimbra/settings.2.log", lines(100'000, 4000));
    diagnosis.write("/var/log/nimbra/settings.1.log", lines(104'000, 4000));
    diagnosis.write(logFile, lines(108'000, 4000));

    EXPECT_EQ(diagnosis.files().at("log.txt"), lines(102'000, 10'000));
    EXPECT_FALSE(diagnosis.files({"--no-logarchive"}).contains("log.txt"));
}

TEST(DiagnoseTest, ADeviceWithoutALogFileSaysSo) {
    const Diagnosis diagnosis;
    diagnosis.make({});

    const auto files = diagnosis.files();

    EXPECT_FALSE(files.contains("log.txt"));
    EXPECT_TRUE(files.at("problems.txt").contains("log: path-1/var/log/nimbra/settings.log: "))
        << files.at("problems.txt");
}

TEST(DiagnoseTest, PartsThatCannotBeReadAreNamedAndTheRestIsThere) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.deviceList.needUpgrade = {"Work Phone"};
    diagnosis.make(description);
    const std::string state = "/var/lib/nimbra/";
    diagnosis.write(state + "accounts.db", "no database");
    diagnosis.write(state + "device.json", "{\"name\": [\"Anns own pad\"]}");
    diagnosis.write(state + "documents.json", "");
    diagnosis.write(state + "preferences/com.example.bad.json", "[");
    diagnosis.write(state + "preferences/com.example.good.json", "{\"a\": 1}");
    diagnosis.write("/run/nimbra/progress/bad.json", "1");
    std::filesystem::create_directory(diagnosis.root() / "usr/share/applications/x.desktop");

    const auto files = diagnosis.files({"--no-logarchive"});

    const std::string& problems = files.at("problems.txt");
    EXPECT_EQ(std::ranges::count(problems, '\n'), 6) << problems;
    for (const char* const part : {"accounts: ", "device: ", "documents: ", "preferences: ",
                                   "progress: ", "applications: "}) {
        EXPECT_NE(('\n' + problems).find('\n' + std::string(part)), std::string::npos) << problems;
    }
    EXPECT_FALSE(problems.contains("Anns own pad")) << problems;
    EXPECT_FALSE(files.contains("accounts.json"));
    EXPECT_TRUE(files.contains("preferences/com.example.good.json"));
    EXPECT_EQ(Json::parse(files.at("device-list.json")).at("needUpgrade").size(), 1U);
    EXPECT_TRUE(files.contains("restrictions.json"));
}

TEST(DiagnoseTest, TheDevicesNameIsNotInTheFoldersName) {
    for (const std::string name : {"Lab's Pad", "a", "24", "error"}) {
        const Diagnosis diagnosis;
        DeviceDescription description;
        description.name = name;
        diagnosis.make(description);
        const std::string inName = name == "Lab's Pad" ? "Lab's_Pad" : name;
        const auto path =
            diagnosis.place() / ("stratafile-" + inName + "-24.03.05-14.07.09.tar.gz");

        ASSERT_EQ(diagnosis.run({"diagnose", path.string()}).status, 0);

        EXPECT_TRUE(entriesOf(path).contains("stratafile-device-1-24.03.05-14.07.09/MANIFEST"));
    }
}

TEST(DiagnoseTest, EntriesHaveAFixedOwner) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    const std::time_t before = std::time(nullptr);
    ASSERT_FALSE(diagnosis.files().empty());

    for (const auto& [name, entry] : entriesOf(diagnosis.archive())) {
        EXPECT_EQ(entry.owner, "nimbra");
        EXPECT_EQ(entry.permissions, name.ends_with('/') ? 0755U : 0644U);
        EXPECT_GE(entry.modified, before);
    }
}

TEST(DiagnoseTest, TheDeviceIsNotChanged) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    diagnosis.write("/run/nimbra/com.example.gone.pid", "999999 1\n");
    const auto before = treeOf(diagnosis.root());

    ASSERT_FALSE(diagnosis.files().empty());
    ASSERT_EQ(diagnosis.run({"status"}).status, 0);

    EXPECT_EQ(treeOf(diagnosis.root()), before);
}

TEST(DiagnoseTest, ChangesThatAnotherProgramHasNotFinishedAreReadAndStay) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    const auto path = diagnosis.root() / "var/lib/nimbra/accounts.db";
    SQLite::Database other(path.string(), SQLite::OPEN_READWRITE);
    other.exec("UPDATE accounts SET uses_stratafile = 0");
    const std::string changes = contentOf(path.string() + "-wal");
    const std::string database = contentOf(path);
    ASSERT_FALSE(changes.empty());

    EXPECT_EQ(diagnosis.json("accounts.json").at(0).at("usesStratafile"), false);

    EXPECT_EQ(contentOf(path.string() + "-wal"), changes);
    EXPECT_EQ(contentOf(path), database);
}

} // namespace
} // namespace nimbra::test
