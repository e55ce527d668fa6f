#include "tests/host/program/Program.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <algorithm>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

ProgramResult runOnRows(const Program& program, std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), {"--bundle", NIMBRA_TEST_BUNDLE});
    static_cast<void>(program.run({"init", program.path("device").string()}));
    arguments.insert(arguments.begin(), {"--root", program.path("device").string()});
    return program.run(arguments);
}

void expectRefused(const ProgramResult& result, const std::string& reason) {
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "settingsctl: " + reason + '\n');
}

TEST(DefaultDevice, IsMadeFromTheSampleOnFirstUse) {
    const Program program;

    const auto first = program.run({"list"});
    const auto second = program.run({"list"});

    EXPECT_EQ(first.status, 0);
    EXPECT_EQ(first.messages,
              "settingsctl: made the sample device in " + program.defaultDevice().string() + '\n');
    EXPECT_EQ(first.output,
              "Nimbra Drive\n"
              "\n"
              "  Nimbra Drive                                                                on\n"
              "    Apps can keep their documents and data in Nimbra Drive, so you can get\n"
              "    to them on all your devices.\n"
              "\n"
              "    Last synced on March 5, 2024\n"
              "\n"
              "  Look Me Up by Email                                                   3 apps ›\n"
              "\n"
              "  2000 Songs                                                                 off\n"
              "  Atlas                                                                      off\n"
              "  Budget                                                                     off\n"
              "  Camera 📷                                                                   on\n"
              "  drafts                                                                     off\n"
              "  Écrivain                                                                    on\n"
              "  Notes                                                                       on\n"
              "  Reader (com.example.reader)                                                 on\n"
              "  Reader (org.example.reader)                                                 on\n"
              "  Recipes                                                                     on\n"
              "  Scanner 2                                                                   on\n"
              "  Scanner 10                                                                  on\n"
              "  Sketches                                                                    on\n"
              "  Weather                                                                    off\n"
              "  Work Files (locked)                                                        off\n"
              "  מכתבים                                                                      on\n"
              "  مكتبة                                                                       on\n"
              "  日記                                                                        on\n"
              "\n"
              "  Use Cellular Data                                                          off\n"
              "    When you’re not connected to Wi-Fi, Nimbra Drive uses cellular data to\n"
              "    transfer documents and data.\n"
              "\n"
              "  [Collect Diagnostics]\n"
              "    Collects information about Nimbra Drive on this device to help find the\n"
              "    cause of a problem. Names and addresses in the archive are replaced.\n");
    EXPECT_EQ(second.messages, "");
    EXPECT_EQ(second.output, first.output);
}

TEST(DefaultDevice, IsBelowTheHomeWhereNoStateDirectoryIsNamed) {
    const Program program;

    const auto result = program.runOther(
        {"env", "-u", "XDG_STATE_HOME", NIMBRA_SETTINGSCTL, "get", "Nimbra Drive"});

    EXPECT_EQ(result.output, "on\n");
    EXPECT_TRUE(std::filesystem::is_directory(program.path("home/.local/state/nimbra/device")));
}

TEST(List, ShowsEveryKindOfRow) {
    const Program program;

    const auto result = runOnRows(program, {"list"});

    EXPECT_EQ(result.output,
              "Nimbra Drive\n"
              "\n"
              "  Notes                                                                      off\n"
              "  Locked (locked)                                                            off\n"
              "  Twin (twin.one)                                                              ›\n"
              "  Twin (twin.two)                                                              ›\n"
              "  Storage                                                               3 apps ›\n"
              "    What the group is about.\n"
              "\n"
              "  [Later]\n"
              "  [Reload Parent]\n"
              "  [Leave]\n"
              "  [Nothing Behind]\n");
    EXPECT_EQ(result.status, 0);
}

TEST(List, PrintsTheRowsAsJson) {
    const Program program;

    const auto result = runOnRows(program, {"list", "--json"});

    const auto rows = nlohmann::ordered_json::parse(result.output);
    ASSERT_EQ(rows.size(), 11U);
    EXPECT_EQ(
        rows[0].dump(),
        R"({"kind":"group","id":"Group","name":null,"enabled":true,"value":null,)"
        R"("footer":"What the group is about.","footerClass":null,"icon":null,"detail":null})");
    EXPECT_EQ(rows[2].dump(),
              R"({"kind":"switch","id":"com.example.locked","name":"Locked","enabled":false,)"
              R"("value":false,"footer":null,"footerClass":null,"icon":null,"detail":null})");
    EXPECT_EQ(rows[5]["kind"], "link");
    EXPECT_EQ(rows[5]["value"], "3 apps");
    EXPECT_EQ(rows[7]["kind"], "button");
}

TEST(List, IsInTheLanguageAskedFor) {
    const Program program;

    EXPECT_NE(program.run({"list", "--locale", "fr-FR"}).output.find("Les apps"),
              std::string::npos);
}

TEST(List, OpensThePageOfTheAccountAskedFor) {
    const Program program;
    const auto description = program.write("device.json", R"({"accounts": [
        {"identifier": "one", "enabled": ["kAccountDataclassTidewater"]}, {"identifier": "two"}]})");
    const std::string device = program.path("device").string();
    ASSERT_EQ(program.run({"init", device, "--from", description.string()}).status, 0);

    EXPECT_EQ(program.run({"--root", device, "get", "Nimbra Drive"}).output, "on\n");
    EXPECT_EQ(program.run({"--root", device, "--account", "two", "get", "Nimbra Drive"}).output,
              "off\n");
    EXPECT_EQ(
        program.run({"--root", device, "--first-setup", "--account", "one", "get", "Nimbra Drive"})
            .output,
        "on\n");
    const auto unknown = program.run({"--root", device, "--account", "three", "list"});
    EXPECT_EQ(unknown.status, 2);
    EXPECT_EQ(unknown.messages, "settingsctl: no account \"three\" (accounts: \"one\", \"two\")\n");
}

TEST(Get, PrintsAValueByNameAndByIdentifier) {
    const Program program;

    EXPECT_EQ(runOnRows(program, {"get", "Notes"}).output, "off\n");
    EXPECT_EQ(runOnRows(program, {"get", "com.example.notes"}).output, "off\n");
    EXPECT_EQ(runOnRows(program, {"get", "Storage"}).output, "3 apps\n");
}

TEST(Get, SaysWhyThereIsNothingToPrint) {
    const Program program;

    expectRefused(runOnRows(program, {"get", "Group"}), "\"Group\" is a heading and has no value");
    expectRefused(runOnRows(program, {"get", "Later"}), "\"Later\" is a button and has no value");
    expectRefused(runOnRows(program, {"get", "Twin"}),
                  "\"Twin\" stands for 2 rows (name one by its identifier: \"twin.one\", "
                  "\"twin.two\")");
    expectRefused(program.run({"--root", program.makePlainDevice("plain"), "get", "Foo"}),
                  "no row \"Foo\" (rows: \"Nimbra Drive\", \"Use Cellular Data\")");
}

/// Makes a device with three applications, two of which are called the same.
std::string deviceWithNotes(const Program& program) {
    const auto description = program.write("notes.json", R"({
        "accounts": [{"identifier": "a", "usesStratafile": true,
                      "enabled": ["kAccountDataclassTidewater"]}],
        "apps": [{"identifier": "one.notes", "name": "Notes"},
                 {"identifier": "two.notes", "name": "Notes"},
                 {"identifier": "clock", "name": "Clock"}],
        "consent": [{"service": "kPRVServiceTidewater", "bundle": "one.notes", "granted": true},
                    {"service": "kPRVServiceTidewater", "bundle": "two.notes", "granted": false},
                    {"service": "kPRVServiceBrackwater", "bundle": "clock", "granted": true}]})");
    const std::string device = program.path("notes").string();
    EXPECT_EQ(program.run({"init", device, "--from", description.string()}).status, 0);
    return device;
}

TEST(Applications, AreReadAndSetByNameAndByIdentifier) {
    const Program program;
    const std::string device = deviceWithNotes(program);

    EXPECT_EQ(program.run({"--root", device, "get", "Clock"}).output, "on\n");
    EXPECT_EQ(program.run({"--root", device, "set", "clock", "off"}).output,
              "~ Clock                                                                      off\n");
    EXPECT_EQ(program.run({"--root", device, "get", "Clock"}).output, "off\n");
    EXPECT_EQ(program.run({"--root", device, "set", "Clock", "on"}).status, 0);
    EXPECT_EQ(program.run({"--root", device, "get", "clock"}).output, "on\n");
}

TEST(Applications, OfTheSameNameAreToldApart) {
    const Program program;
    const std::string device = deviceWithNotes(program);

    EXPECT_NE(program.run({"--root", device, "list"})
                  .output.find("  Clock                                                           "
                               "            on\n"
                               "  Notes (one.notes)                                               "
                               "            on\n"
                               "  Notes (two.notes)                                               "
                               "           off\n"),
              std::string::npos);
    for (const std::string command : {"get", "set"}) {
        std::vector<std::string> words{"--root", device, command, "Notes"};
        if (command == "set") {
            words.emplace_back("on");
        }
        expectRefused(program.run(words),
                      "\"Notes\" stands for 2 rows (name one by its identifier: \"one.notes\", "
                      "\"two.notes\")");
    }
    EXPECT_EQ(program.run({"--root", device, "get", "two.notes"}).output, "off\n");
    EXPECT_EQ(program.run({"--root", device, "set", "two.notes", "on"}).output,
              "~ Notes (two.notes)                                                           on\n");
    EXPECT_EQ(program.run({"--root", device, "get", "two.notes"}).output, "on\n");
    EXPECT_EQ(program.run({"--root", device, "get", "one.notes"}).output, "on\n");
}

TEST(Applications, HaveTheirIconsInTheListForPrograms) {
    const Program program;

    const auto rows = nlohmann::ordered_json::parse(
        program.run({"--root", deviceWithNotes(program), "list", "--json"}).output);

    const auto clock = std::ranges::find(rows, "clock", [](const auto& row) { return row["id"]; });
    ASSERT_NE(clock, rows.end());
    EXPECT_EQ(clock->dump(),
              R"({"kind":"switch","id":"clock","name":"Clock","enabled":true,"value":true,)"
              R"("footer":null,"footerClass":null,"icon":"clock","detail":null})");
}

TEST(Set, TurnsASwitchAndPrintsWhatChanges) {
    const Program program;

    const auto result = runOnRows(program, {"set", "Notes", "on"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output,
              "~ Notes                                                                       on\n"
              "+ Details                                                                      ›\n");
}

TEST(Set, RefusesWhatCannotBeSet) {
    const Program program;

    expectRefused(runOnRows(program, {"set", "Locked", "on"}), "\"Locked\" is locked");
    expectRefused(runOnRows(program, {"set", "Later", "on"}),
                  "\"Later\" is a button, not a switch");
    expectRefused(runOnRows(program, {"set", "Storage", "on"}),
                  "\"Storage\" is a link, not a switch");
}

TEST(Set, TurnsTheMasterSwitchAndSaysWhatItIsDoing) {
    const Program program;
    const std::string device = program.makePlainDevice("device");

    const auto off = program.run({"--root", device, "set", "Nimbra Drive", "off"});

    EXPECT_EQ(off.status, 0);
    EXPECT_EQ(off.messages, "Turning Off Nimbra Drive…\n");
    EXPECT_EQ(off.output,
              "- Use Cellular Data\n"
              "~ Nimbra Drive                                                               off\n");
    EXPECT_EQ(program.run({"--root", device, "get", "Nimbra Drive"}).output, "off\n");

    const auto on = program.run({"--root", device, "set", "Nimbra Drive", "on"});

    EXPECT_EQ(on.messages, "Turning On Nimbra Drive…\n");
    EXPECT_EQ(on.output,
              "~ Nimbra Drive                                                                on\n"
              "+ Use Cellular Data                                                          off\n");
}

TEST(Set, TurnsCellularDataForGood) {
    const Program program;
    const std::string device = program.path("device").string();
    ASSERT_EQ(program.run({"init", device}).status, 0);

    const auto result = program.run({"--root", device, "set", "Use Cellular Data", "on"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "");
    EXPECT_EQ(program.run({"--root", device, "get", "Use Cellular Data"}).output, "on\n");
}

TEST(Set, SaysWhenAChangeCouldNotBeSavedAndLeavesEverythingAsItWas) {
    const Program program;
    const auto device = program.path("device");
    ASSERT_EQ(program.run({"init", device.string()}).status, 0);
    // A table that refuses every change, as a database that is damaged in places would.
    SQLite::Database(device / "var/lib/nimbra/accounts.db", SQLite::OPEN_READWRITE)
        .exec("CREATE TRIGGER refusal BEFORE UPDATE ON account_dataclasses "
              "BEGIN SELECT RAISE(ABORT, 'refused'); END");

    const auto result = program.run({"--root", device.string(), "set", "Nimbra Drive", "off"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_TRUE(result.messages.ends_with(
        "settingsctl: \"Nimbra Drive\" is still on: the change could not be saved\n"))
        << result.messages;
    EXPECT_EQ(program.run({"--root", device.string(), "get", "Nimbra Drive"}).output, "on\n");
}

TEST(Set, RefusesALockedCellularSwitch) {
    const Program program;
    const auto device = program.path("device");
    ASSERT_EQ(program.run({"init", device.string()}).status, 0);
    program.write("device/var/lib/nimbra/restrictions.json",
                  R"({"appCellularDataModificationAllowed": false})");

    expectRefused(program.run({"--root", device.string(), "set", "Use Cellular Data", "on"}),
                  "\"Use Cellular Data\" is locked");
}

TEST(Set, TakesNothingButOnAndOff) {
    const Program program;

    const auto result = runOnRows(program, {"set", "Notes", "maybe"});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages, "settingsctl: \"on\" or \"off\" expected, not \"maybe\"\n");
}

TEST(Tap, PressesAButtonAndPrintsWhatChanges) {
    const Program program;

    const auto result = runOnRows(program, {"tap", "Later"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output,
              "+ Arrived                                                                      ›\n");
}

TEST(Tap, RefusesWhatCannotBeTapped) {
    const Program program;

    expectRefused(runOnRows(program, {"tap", "Notes"}), "\"Notes\" is a switch, not a button");
    expectRefused(runOnRows(program, {"tap", "Storage"}),
                  "\"Storage\" leads to a page that this device does not have");
    expectRefused(runOnRows(program, {"tap", "Nothing Behind"}),
                  "\"Nothing Behind\" does nothing in this version");
}

TEST(Tap, MayCloseThePage) {
    const Program program;

    const auto result = runOnRows(program, {"tap", "Leave"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "The page has closed.\n");
}

} // namespace
} // namespace nimbra::test
