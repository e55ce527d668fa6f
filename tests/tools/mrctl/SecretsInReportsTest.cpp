#include "tests/device/TestFiles.h"
#include "tests/tools/mrctl/Diagnosis.h"
#include "tools/mrctl/Characters.h"

#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

using device::DeviceDescription;
using Json = nlohmann::json;

constexpr auto logFile = "/var/log/nimbra/settings.log";

/// Expects that no secret is in an archive: neither in its bytes, nor in a name or a file in it, be
/// it in capitals or not.
void expectNone(const Diagnosis& diagnosis, const std::vector<std::string>& secrets) {
    const auto files = diagnosis.files();
    const std::string raw = contentOf(diagnosis.archive());
    for (const std::string& secret : secrets) {
        EXPECT_EQ(raw.find(secret), std::string::npos) << secret;
        for (const auto& [name, content] : files) {
            EXPECT_EQ(mrctl::lowerCase(name).find(secret), std::string::npos) << secret << name;
            EXPECT_EQ(mrctl::lowerCase(content).find(secret), std::string::npos)
                << secret << " in " << name << '\n'
                << content;
        }
    }
}

TEST(SecretsInReportsTest, NamesAreFoundInOtherSpellingsAndInParts) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.name = "Rosalindes B\u00fcrotelefon";
    description.accounts = {{.identifier = "rosa.zwickm\u00fchle@example.com"}};
    description.identity = "\u00c9mile Vogel";
    description.containers = {{.identifier = "com.zebulon.geheimsache"}};
    diagnosis.make(description);
    diagnosis.write(logFile, "ROSALINDES B\u00dcROTELEFON, rosalindes\u00a0b\u00fcrotelefon\n"
                             "Rosalindes-Bu\u0308rotelefon Rosalindes_B%c3%bcrotelefon\n"
                             "Rosalindes+B%25C3%25BCrotelefon Rosalindes B\\u00FCrotelefon\n"
                             "Rosa\x1b[1mlindes RosalindesBuerotelefon\n"
                             "of Rosalindes, rosa.ZWICKM\u00dcHLE, zwickmuehle, emile_vogel\n"
                             "com~zebulon~geheimsache, the Geheimsache\n");

    expectNone(diagnosis, {"rosalindes", "telefon", "zwickm", "emile", "vogel", "geheimsache"});
    EXPECT_EQ(diagnosis.files().at("log.txt").find("device-1, device-1\ndevice-1 device-1\n"), 0U)
        << diagnosis.files().at("log.txt");
}

TEST(SecretsInReportsTest, AnAccountThatIsANumberIsFoundInNumbers) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.accounts = {{.identifier = "4915155588123"}, {.identifier = "58123"}};
    description.apps = {{.identifier = "org.app.4915155588123", .name = "App"}};
    description.preferences = {
        {"com.example.a",
         {{"n", 4915155588123}, {"list", {-4915155588123, 58123, 7}}, {"real", 4915155588123.0}}},
        {"4915155588123", {{"a", 1}}}};
    diagnosis.make(description);

    expectNone(diagnosis, {"4915155588123", "58123"});
    EXPECT_EQ(diagnosis.json("preferences/com.example.a.json").at("list").at(2), 7);
}

TEST(SecretsInReportsTest, PreferencesHideWhatTheirKeysTellOf) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.preferences = {{"com.example.a",
                                {{"pass", "kasimira"},
                                 {"pin", 4711471},
                                 {"email", {{"home", "kasimirb"}}},
                                 {"nickname", "kasimirc"},
                                 {"contacts", {"kasimird", {{"x", 4711472}}}},
                                 {"SSID", "kasimire"},
                                 {"device", "kasimirf"},
                                 {"ownerName", "kasimirg"},
                                 {"lastFolder", "kasimirh"},
                                 {"passwordIsKept", true},
                                 {"log.level", 7}}},
                               {"Kasimir private", {{"b", 2}}},
                               {"kasimir\nMANIFEST", {{"b", 2}}}};
    diagnosis.make(description);

    expectNone(diagnosis, {"kasimir", "4711471", "4711472"});
    const Json kept = diagnosis.json("preferences/com.example.a.json");
    EXPECT_EQ(kept.at("passwordIsKept"), true);
    EXPECT_EQ(kept.at("log.level"), 7);
}

TEST(SecretsInReportsTest, SentencesAreNotNames) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.lastSyncDate = {{"error",
                                 {{"domain", "NimbraDevice"},
                                  {"code", 17},
                                  {"description", "account of ludmilla is closed"}}}};
    description.wirelessVariant = "network of ludmilla";
    description.cloudSyncDenied = {"app of ludmilla", "com.example.work"};
    description.consent = {{.service = "service of ludmilla", .bundle = "bundle of ludmilla"}};
    diagnosis.make(description);
    diagnosis.write("/run/nimbra/progress/x.json",
                    R"({"fraction": 0.5, "fileOperationKind": "for ludmilla"})");

    expectNone(diagnosis, {"ludmilla"});
    EXPECT_EQ(diagnosis.json("documents.json").at("lastSyncDate").at("error").at("code"), 17);
    EXPECT_EQ(diagnosis.json("documents.json").at("lastSyncDate").at("error").at("domain"),
              "NimbraDevice");
    EXPECT_EQ(diagnosis.json("restrictions.json").at("cloudSyncDenied").at(1), "com.example.work");
}

TEST(SecretsInReportsTest, TheLogCannotMakeSecretsOfWhatHelps) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.accounts = {
        {.identifier = "ann@example.com", .enabled = {"kAccountDataclassTidewater"}}};
    description.apps = {{.identifier = "com.example.notes", .name = "Notes"}};
    description.preferences = {{"com.example.a", {{"name", "password"}, {"password", "x"}}}};
    diagnosis.make(description);
    diagnosis.write(logFile, "2024-03-05T13:00:00.000+0000 error: com.example.notes failed\n"
                             "password: kAccountDataclassTidewater\nowner=2024-03-05T13\n"
                             "token: com.example.notes\nname=error\n");

    const auto files = diagnosis.files();

    EXPECT_TRUE(files.at("log.txt").starts_with(
        "2024-03-05T13:00:00.000+0000 error: com.example.notes failed\n"))
        << files.at("log.txt");
    EXPECT_EQ(Json::parse(files.at("accounts.json")).at(0).at("enabled").at(0),
              "kAccountDataclassTidewater");
    EXPECT_TRUE(Json::parse(files.at("preferences/com.example.a.json")).contains("password"));
}

TEST(SecretsInReportsTest, NamesOfThisSystemHoldNoValues) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.accounts = {{.identifier = "primary",
                             .provisioned = {"kAccountDataclassTSYDatabaseService"},
                             .tessaryAccount = "database"},
                            {.identifier = "tidewater"}};
    diagnosis.make(description);
    diagnosis.write(logFile, "not a consent database\n");

    EXPECT_EQ(diagnosis.json("accounts.json").at(0).at("provisioned").at(0),
              "kAccountDataclassTSYDatabaseService");
    EXPECT_EQ(diagnosis.files().at("log.txt"), "not a consent database\n");
}

TEST(SecretsInReportsTest, KeysInTextFormAreLeftOut) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    diagnosis.write(logFile, "a\n-----BEGIN EC KEY-----\nabc\nde=\n-----END EC KEY-----\nb\n"
                             "-----BEGIN KEY-----\\nxyz\\n-----END KEY-----\nc\n");

    EXPECT_EQ(diagnosis.files().at("log.txt"),
              "a\n-----BEGIN secret-1\n(a line of a key is left out)\n"
              "(a line of a key is left out)\n-----END EC KEY-----\nb\n"
              "-----BEGIN secret-2\nc\n");
}

TEST(SecretsInReportsTest, LongLinesAreLeftOut) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    const std::string longest(4096, '.');
    std::string endless;
    while (endless.size() < 300'000) {
        endless += "password=";
    }
    diagnosis.write(logFile, longest + '\n' + longest + "x\n" + endless + "\nend\n");

    EXPECT_EQ(diagnosis.files().at("log.txt"), longest + "\n(a line of 4097 bytes is left out)\n" +
                                                   "(a line of 300006 bytes is left out)\nend\n");
}

TEST(SecretsInReportsTest, AnAddressHasOnePseudonymInCapitalsAndNot) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    diagnosis.write(logFile, "to trudi.k@example.org\nto Trudi.K@Example.ORG\n");

    EXPECT_EQ(diagnosis.files().at("log.txt"), "to email-1\nto email-1\n");
}

} // namespace
} // namespace nimbra::test
