#include "tests/host/program/Program.h"

#include <algorithm>
#include <fstream>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

/// A device with the applications "good" and "bad", of which the entry of "bad" is replaced.
struct ApplicationsTest : testing::Test {
    Program program;
    const std::string device = program.path("device").string();

    void makeDevice() const {
        const auto description = program.write("device.json", R"({
            "accounts": [{"identifier": "primary", "usesStratafile": true,
                          "enabled": ["kAccountDataclassTidewater"]}],
            "cellularData": false,
            "apps": [{"identifier": "good", "name": "Good"}, {"identifier": "bad", "name": "Bad"}],
            "consent": [{"service": "kPRVServiceTidewater", "bundle": "good", "granted": true},
                        {"service": "kPRVServiceTidewater", "bundle": "bad", "granted": true}]})");
        ASSERT_EQ(program.run({"init", device, "--from", description.string()}).status, 0);
    }
    void writeBadEntry(const std::string& content) const {
        std::ofstream(program.path("device/usr/share/applications/bad.desktop")) << content;
    }
};

TEST_F(ApplicationsTest, ABadEntryIsToldWithItsLineAndTheOtherRowsStand) {
    makeDevice();
    const std::string file = "Bad desktop entry: /usr/share/applications/bad.desktop: ";
    struct Case {
        std::string content;
        std::vector<std::string> rows;
        std::string message;
    };
    const std::vector<Case> cases{
        {"[Desktop Entry]\nIcon=x\n", {"bad", "Good"}, "line 1: no usable Name"},
        {"[Desktop Entry]\nName=B\xFF\n", {"bad", "Good"}, "line 1: no usable Name (and 1 more)"},
        {"[Desktop Entry]\nName=A\n[Desktop Entry]\nName=B\n", {"A", "Good"}, "line 3: "},
        {"[Desktop Entry]\nName=A\nX-Nimbra-Entitlements={x\n", {"A", "Good"}, "line 3: "},
        {"nothing\n", {"Good"}, "line 1: no group [Desktop Entry]"},
    };
    for (const Case& entry : cases) {
        writeBadEntry(entry.content);

        const auto result = program.run({"--root", device, "list"});

        EXPECT_EQ(result.status, 0);
        for (const std::string& row : entry.rows) {
            EXPECT_NE(result.output.find("\n  " + row + ' '), std::string::npos)
                << row << result.output;
        }
        EXPECT_EQ(std::ranges::count(result.messages, '\n'), 1) << result.messages;
        EXPECT_NE(result.messages.find(file + entry.message), std::string::npos)
            << entry.message << result.messages;
    }
}

TEST_F(ApplicationsTest, WhatAnotherProgramChangesShowsWithTheNextList) {
    makeDevice();
    EXPECT_EQ(program.run({"--root", device, "get", "Good"}).output, "on\n");

    EXPECT_EQ(program.run({"--root", device, "set", "good", "off"}).status, 0);

    EXPECT_EQ(program.run({"--root", device, "get", "Good"}).output, "off\n");
    EXPECT_EQ(program.run({"--root", device, "get", "bad"}).output, "on\n");
}

} // namespace
} // namespace nimbra::test
