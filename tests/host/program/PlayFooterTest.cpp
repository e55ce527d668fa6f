#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

/// A scenario on a device whose switch is on, with these steps.
std::string scenario(const std::string& steps) {
    return R"({"device": {"accounts": [{"identifier": "primary", "primary": true,
        "usesStratafile": true, "enabled": ["kAccountDataclassTidewater"]}]},
        "steps": [)" +
           steps + "]}";
}

void expectFailure(const std::string& steps, const std::string& message) {
    const Program program;

    const auto result = program.run({"play", "-"}, scenario(steps));

    EXPECT_EQ(result.status, 1) << steps;
    EXPECT_EQ(result.messages, "settingsctl: " + message + '\n');
    EXPECT_TRUE(program.leftNothingBehind());
}

void expectRefusal(const std::string& step, const std::string& message) {
    const Program program;

    const auto result = program.run({"play", "-"}, scenario(step));

    EXPECT_EQ(result.status, 2) << step;
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages, "settingsctl: standard input: /steps/0" + message + '\n');
}

TEST(PlayFooter, AStepWithoutItsProgressCannotBeDone) {
    expectFailure(R"({"do": "updateProgress", "id": "p", "fraction": 0.5})",
                  "step 0 (updateProgress): no progress \"p\" is published");
    expectFailure(R"({"do": "unpublishProgress", "id": "p"})",
                  "step 0 (unpublishProgress): no progress \"p\" is published");
    expectFailure(R"({"do": "publishProgress", "id": "p"}, {"do": "unpublishProgress", "id": "p"},
                     {"do": "updateProgress", "id": "p"})",
                  "step 2 (updateProgress): no progress \"p\" is published");
}

TEST(PlayFooter, AProgressIsPublishedOnce) {
    expectFailure(R"({"do": "publishProgress", "id": "p"}, {"do": "publishProgress", "id": "p"})",
                  "step 1 (publishProgress): a progress \"p\" is published already");
}

TEST(PlayFooter, AStepWithoutItsFooterCannotBeDone) {
    expectFailure(R"({"do": "footer"})", "step 0 (footer): no page is open");
    expectFailure(R"({"do": "moveFooter", "window": true})",
                  "step 0 (moveFooter): no page is open");
    expectFailure(R"({"do": "open"}, {"do": "set", "row": "Nimbra Drive", "value": false},
                     {"do": "footer"})",
                  "step 2 (footer): the page shows no status footer");
    expectFailure(R"({"do": "open"}, {"do": "set", "row": "Nimbra Drive", "value": false},
                     {"do": "moveFooter", "window": false})",
                  "step 2 (moveFooter): the page shows no status footer");
}

TEST(PlayFooter, WhatIsNoStepOfTheFooterIsRefused) {
    expectRefusal(R"({"do": "advance", "seconds": -1})",
                  "/seconds: expected a number from 0 to 315576000, found -1");
    expectRefusal(R"({"do": "advance", "seconds": 1e300})",
                  "/seconds: expected a number from 0 to 315576000, found 1e+300");
    expectRefusal(R"({"do": "advance"})", "/seconds: expected a number, found nothing");
    expectRefusal(R"({"do": "moveFooter", "window": "in"})",
                  "/window: expected true or false, found \"in\"");
    expectRefusal(R"({"do": "publishProgress"})", "/id: expected a progress's id, found nothing");
    expectRefusal(R"({"do": "publishProgress", "id": "p", "fraction": "half"})",
                  "/fraction: expected a number, found \"half\"");
    expectRefusal(R"({"do": "unpublishProgress", "id": "p", "fraction": 1})",
                  "/fraction: unknown key; expected one of do, id");
    expectRefusal(R"({"do": "post", "name": "n", "distributed": true,
                      "userInfo": {"MRSyncStatusLastSyncDateKey": "yesterday"}})",
                  "/userInfo/MRSyncStatusLastSyncDateKey: expected an RFC 3339 instant such as "
                  "\"2024-03-05T14:07:09Z\", found \"yesterday\"");
}

TEST(PlayFooter, AChangeOfTheDateMovesNoTimer) {
    const Program program;

    const auto result = program.run({"play", "-"}, R"({"device": {
        "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                      "enabled": ["kAccountDataclassTidewater"]}],
        "documents": {"lastSyncDate": "2024-03-05T14:07:00Z", "lastSyncText": "Synced."}},
        "steps": [{"do": "open"}, {"do": "appear"},
                  {"do": "change", "device": {"now": "2030-01-01T00:00:00Z"}},
                  {"do": "advance", "seconds": 59}, {"do": "advance", "seconds": 1}]})");

    EXPECT_EQ(result.status, 0);
    const auto fired = result.output.find(R"("event":"timer","queue":"main","op":"fire")");
    ASSERT_NE(fired, std::string::npos);
    EXPECT_GT(fired, result.output.find(R"("index":4)"));
    EXPECT_EQ(result.output.find(R"("op":"fire")", fired + 60), std::string::npos);
}

} // namespace
} // namespace nimbra::test
