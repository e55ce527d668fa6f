#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

ProgramResult play(const std::string& steps, const std::string& device = R"(
    "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": false}])") {
    const Program program;
    auto result = program.run({"play", "-"}, R"({"device": {)" + device + R"(}, "steps": [)" +
                                                 R"({"do": "open"})" + steps + "]}");
    EXPECT_TRUE(program.leftNothingBehind());
    return result;
}

constexpr const char* tapUpgrade = R"(, {"do": "tap", "row": "Upgrade to Nimbra Drive"})";

void expectRefused(const ProgramResult& result, const std::string& reason) {
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: step " + reason + '\n');
}

TEST(PlayScreen, StepsOfAScreenNeedOne) {
    expectRefused(play(R"(, {"do": "views"})"), "1 (views): no screen is presented");
    expectRefused(play(R"(, {"do": "layout", "width": 1, "height": 1})"),
                  "1 (layout): no screen is presented");
    expectRefused(play(R"(, {"do": "tapButton", "title": "Upgrade"})"),
                  "1 (tapButton): no screen is presented");
    expectRefused(play(R"(, {"do": "alert", "choose": "OK"})"), "1 (alert): no alert is shown");
}

TEST(PlayScreen, AScreenThatHasGoneHasNoViews) {
    expectRefused(play(std::string(tapUpgrade) +
                       R"(, {"do": "tapButton", "title": "cancel"}, {"do": "views"})"),
                  "3 (views): no screen is presented");
}

TEST(PlayScreen, TheButtonCannotBeTouchedBeforeTheDevicesAreKnown) {
    expectRefused(play(std::string(tapUpgrade) + R"(, {"do": "tapButton", "title": "Upgrade"})",
                       R"("accounts": [{"identifier": "primary"}], "deviceList": "never")"),
                  "2 (tapButton): the button \"Upgrade\" is disabled");
}

TEST(PlayScreen, WhatAnAlertCoversCannotBeTouched) {
    expectRefused(play(std::string(tapUpgrade) + R"(, {"do": "tapButton", "title": "Upgrade"},
                       {"do": "tapButton", "title": "cancel"})"),
                  "3 (tapButton): an alert covers the screen");
}

TEST(PlayScreen, AnAnswerThatTheAlertDoesNotHaveIsRefused) {
    expectRefused(play(std::string(tapUpgrade) + R"(, {"do": "tapButton", "title": "Upgrade"},
                       {"do": "alert", "choose": "Maybe"})"),
                  "3 (alert): the alert has no answer \"Maybe\" "
                  "(answers: \"Cancel\", \"Continue\")");
}

TEST(PlayScreen, TheRowsUnderAScreenCannotBeUsed) {
    expectRefused(play(std::string(tapUpgrade) + tapUpgrade),
                  "2 (tap): the list is covered by what was opened from it");
    expectRefused(
        play(std::string(tapUpgrade) + R"(, {"do": "set", "row": "Nimbra Drive", "value": true})"),
        "2 (set): the list is covered by what was opened from it");
}

TEST(PlayScreen, TheRowsUnderAScreenCanBeRead) {
    EXPECT_EQ(
        play(std::string(tapUpgrade) + R"(, {"do": "get", "row": "Nimbra Drive"}, {"do": "list"})")
            .status,
        0);
}

TEST(PlayScreen, AScreenHasNoNegativeSize) {
    const Program program;
    const auto result =
        program.run({"play", "-"}, R"({"steps": [{"do": "layout", "width": -1, "height": 1}]})");

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages,
              "settingsctl: standard input: /steps/0/width: expected a number from "
              "0 up, found -1\n");
}

TEST(PlayScreen, WithoutAnAccountTheUpgradeFailsAndSaysSo) {
    const auto result = play(std::string(tapUpgrade) + R"(,
                                 {"do": "tapButton", "title": "Upgrade"},
                                 {"do": "alert", "choose": "Continue"},
                                 {"do": "alert", "choose": "OK"})",
                             R"("accounts": [])");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "");
    EXPECT_NE(result.output.find(R"("op":"request","account":null})"), std::string::npos);
    EXPECT_NE(result.output.find(R"("description":"there is no account to be saved")"),
              std::string::npos);
    EXPECT_NE(result.output.find(R"("what":"accountAlert","animated":true,)"
                                 R"("title":"Upgrade Failed")"),
              std::string::npos);
    EXPECT_TRUE(result.output.ends_with(
        R"({"event":"dismiss","queue":"main","what":"upgrade","animated":true})"
        "\n"));
}

TEST(PlayScreen, AfterTheUpgradeThePageIsClosed) {
    expectRefused(play(std::string(tapUpgrade) + R"(, {"do": "tapButton", "title": "Upgrade"},
                       {"do": "alert", "choose": "Continue"}, {"do": "list"})"),
                  "4 (list): no page is open");
}

} // namespace
} // namespace nimbra::test
