#include "tests/host/program/DeviceProgram.h"
#include "tests/host/program/TypedProgram.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <csignal>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

constexpr const char* row = "Upgrade to Nimbra Drive";

/// A device whose account uses the older storage.
class Upgrade : public DeviceProgram {
protected:
    Upgrade() { init(R"("deviceList": {"needUpgrade": ["Work Phone"], "incompatible": ["Den"]})"); }

    void init(const std::string& more) {
        makeDevice(R"({"accounts": [{"identifier": "primary", "usesStratafile": false}], )" + more +
                   "}");
    }
    void expectUpgraded() const {
        EXPECT_EQ(run({"get", "Nimbra Drive"}).output, "on\n");
        EXPECT_EQ(run({"list"}).output.find(row), std::string::npos);
    }
    void expectNotUpgraded() const {
        EXPECT_EQ(run({"get", "Nimbra Drive"}).output, "off\n");
        EXPECT_NE(run({"list"}).output.find(row), std::string::npos);
    }
};

constexpr const char* screen =
    "Nimbra Drive\n"
    "\n"
    "  Upgrade to Nimbra Drive\n"
    "\n"
    "  *Before You Upgrade*\n"
    "  Your documents won’t be available on the following device until you update\n"
    "  its system: *Work Phone*.\n"
    "  *Den* can’t be updated and will no longer have access to your documents.\n"
    "\n"
    "  [Upgrade]\n"
    "\n"
    "Upgrade to Nimbra Drive?\n"
    "  Your documents will move to Nimbra Drive. You can’t undo this.\n";

TEST_F(Upgrade, ShowsTheScreenAsksAndGoesThroughWithIt) {
    const auto result = run({"tap", row}, "y\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output,
              std::string(screen) + "  Continue [y], Cancel [n]: \nThe page has closed.\n");
    EXPECT_EQ(result.messages, "Upgrading to Nimbra Drive…\n");
    expectUpgraded();
}

TEST_F(Upgrade, AsksNobodyWhoSaysYesBefore) {
    const auto result = run({"tap", "--yes", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, std::string(screen) + "The page has closed.\n");
    expectUpgraded();
}

TEST_F(Upgrade, TakesTheTitleOfTheAnswerHoweverItIsWritten) {
    EXPECT_EQ(run({"tap", row}, " continue \n").status, 0);
    expectUpgraded();
}

TEST_F(Upgrade, TakesAYesHoweverItIsWritten) {
    EXPECT_EQ(run({"tap", row}, "Y\n").status, 0);
    expectUpgraded();
}

TEST_F(Upgrade, WhatWasTypedBeforeTheQuestionIsNoAnswer) {
    program.write("device/var/lib/nimbra/device-list.json", R"({"delay": 3})");
    TypedProgram terminal(program, onDevice({"tap", row}));
    ASSERT_TRUE(terminal.shows("Waiting for an answer; ^C gives up."));
    terminal.type("y\r");

    ASSERT_TRUE(terminal.shows("Continue [y], Cancel [n]: "));
    terminal.type("n\r");
    ASSERT_TRUE(terminal.shows("settingsctl: cancelled; nothing has been changed"));
    EXPECT_EQ(terminal.end(), 1);
    expectNotUpgraded();
}

TEST_F(Upgrade, AWarningThatCannotBeShownIsNoneToSayYesTo) {
    for (const char* const command :
         {R"("$0" "$@" --yes "Upgrade to Nimbra Drive" >/dev/full)",
          R"(echo y | "$0" "$@" "Upgrade to Nimbra Drive" >/dev/full)"}) {
        const auto result = program.runOther({"sh", "-c", command, NIMBRA_SETTINGSCTL, "--root",
                                              program.path("device").string(), "tap"});

        EXPECT_EQ(result.status, 1);
        EXPECT_EQ(result.messages,
                  "settingsctl: the output cannot be written, so nothing has been changed\n");
    }
    expectNotUpgraded();
}

TEST_F(Upgrade, AShellThatWaitsEndsWhenItIsToEnd) {
    init(R"("deviceList": "never")");
    TypedProgram shell(program, onDevice({"shell"}));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap " + std::string(row) + "\r");
    ASSERT_TRUE(shell.shows("Waiting for an answer; ^C gives up."));

    shell.send(SIGTERM);

    EXPECT_EQ(shell.end(), -SIGTERM);
}

TEST_F(Upgrade, AShellTakesTheYesBeforeAsWell) {
    const auto result = run({"shell"}, "tap --yes " + std::string(row) + "\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, std::string(screen) + "The page has closed.\n");
    expectUpgraded();
}

TEST_F(Upgrade, AnyOtherAnswerLeavesAllAsItWas) {
    for (const char* const answer : {"n\n", "\n", "no\n", "Cancel\n", "yellow\n"}) {
        const std::string before = contentsOf(program.path("device/var"));

        const auto result = run({"tap", row}, answer);

        EXPECT_EQ(result.status, 1) << answer;
        EXPECT_EQ(result.messages, "settingsctl: cancelled; nothing has been changed\n") << answer;
        EXPECT_EQ(contentsOf(program.path("device/var")), before) << answer;
    }
    expectNotUpgraded();
}

TEST_F(Upgrade, WithoutAnAnswerSaysHowToGiveOne) {
    const auto result = run({"tap", row});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages,
              "settingsctl: nobody answered, so nothing has been changed (--yes answers)\n");
    expectNotUpgraded();
}

TEST_F(Upgrade, AnAccountThatCannotBeSavedIsAFailure) {
    // Whoever takes the account away while the question stands makes the save fail.
    TypedProgram terminal(program, onDevice({"tap", row}));
    ASSERT_TRUE(terminal.shows("Continue [y], Cancel [n]: "));
    SQLite::Database(program.path("device/var/lib/nimbra/accounts.db"), SQLite::OPEN_READWRITE)
        .exec("DELETE FROM accounts");
    terminal.type("y\r");

    ASSERT_TRUE(terminal.shows("Upgrading to Nimbra Drive…"));
    ASSERT_TRUE(terminal.shows("settingsctl: Upgrade Failed: Your account couldn’t be upgraded "
                               "to Nimbra Drive. Try again later."));
    EXPECT_EQ(terminal.end(), 1);
}

TEST_F(Upgrade, WaitsForTheDevicesAsLongAsTheUserDoes) {
    init(R"("deviceList": "never")");
    TypedProgram terminal(program, onDevice({"tap", row}));

    ASSERT_TRUE(terminal.shows("Waiting for an answer; ^C gives up."));
    terminal.send(SIGINT);

    ASSERT_TRUE(terminal.shows("settingsctl: cancelled; nothing has been changed"));
    EXPECT_EQ(terminal.end(), 1);
    expectNotUpgraded();
}

TEST_F(Upgrade, ComesWhenTheAnswerDoes) {
    program.write("device/var/lib/nimbra/device-list.json",
                  R"({"needUpgrade": ["Late"], "delay": 2})");

    const auto result = run({"tap", "--yes", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(result.output.starts_with("Waiting for an answer; ^C gives up.\n"));
    EXPECT_NE(result.output.find("*Late*"), std::string::npos);
    expectUpgraded();
}

TEST_F(Upgrade, GoesOnWithoutAListThatCannotBeRead) {
    program.write("device/var/lib/nimbra/device-list.json", "{");

    const auto result = run({"tap", "--yes", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.output.find("only on devices with a recent system."), std::string::npos);
    expectUpgraded();
}

TEST_F(Upgrade, ReadsItsAnswerFromTheLinesOfAShell) {
    const auto result = run({"shell"}, "tap " + std::string(row) + "\nn\nget Nimbra Drive\ntap " +
                                           std::string(row) + "\ny\nlist\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: cancelled; nothing has been changed\n"
                               "Upgrading to Nimbra Drive…\n");
    EXPECT_EQ(result.output, std::string(screen) + "  Continue [y], Cancel [n]: \noff\n" + screen +
                                 "  Continue [y], Cancel [n]: \nThe page has closed.\n");
    expectUpgraded();
}

TEST_F(Upgrade, AsksAtThePromptOfAShell) {
    TypedProgram shell(program, onDevice({"shell"}));

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap " + std::string(row) + "\r");
    ASSERT_TRUE(shell.shows("Continue [y], Cancel [n]: "));
    shell.type("n\r");
    ASSERT_TRUE(shell.shows("settingsctl: cancelled; nothing has been changed"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    // The answer is no command to come back to: this is the one before it.
    shell.type("\x1b[A\r");
    ASSERT_TRUE(shell.shows("Continue [y], Cancel [n]: "));
    shell.type("y\r");
    ASSERT_TRUE(shell.shows("The page has closed."));
    EXPECT_EQ(shell.end(), 0);
    expectUpgraded();
}

TEST_F(Upgrade, SpeaksTheLanguageOfTheUser) {
    const auto result =
        run({"--locale", "de-DE", "tap", "Auf Nimbra Drive umsteigen"}, "Fortfahren\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.output.find("  *Vor dem Umstieg*\n"), std::string::npos);
    EXPECT_NE(result.output.find("  Fortfahren [y], Abbrechen [n]: "), std::string::npos);
    EXPECT_EQ(result.messages, "Account wird auf Nimbra Drive umgestellt …\n");
    expectUpgraded();
}

TEST_F(Upgrade, InTheFirstSetupSavesTheAccountAsWell) {
    EXPECT_EQ(run({"--first-setup", "tap", "--yes", row}).status, 0);
    expectUpgraded();
}

} // namespace
} // namespace nimbra::test
