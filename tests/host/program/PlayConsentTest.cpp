#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <sstream>
#include <string>

namespace nimbra::test {
namespace {

/// The values that the trace of `steps` prints, on a device that allows the cloud to the
/// application "a", with `faults`.
std::string valuesOf(const std::string& faults, const std::string& steps) {
    const Program program;
    const auto result = program.run({"play", "-"}, R"({
        "device": {
            "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                          "enabled": ["kAccountDataclassTidewater"]}],
            "apps": [{"identifier": "a"}],
            "consent": [{"service": "kPRVServiceTidewater", "bundle": "a", "granted": true}],
            "faults": )" + faults + R"(},
        "steps": [{"do": "open"})" + steps + "]}");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "");
    std::string values;
    std::istringstream trace(result.output);
    for (std::string line; std::getline(trace, line);) {
        if (line.starts_with(R"({"event":"value")")) {
            values += line.ends_with(R"("value":true})") ? "on " : "off ";
        }
    }
    return values;
}

const std::string set = R"(, {"do": "set", "row": "a", "value": false})";
const std::string get = R"(, {"do": "get", "row": "a"})";
// A page that is opened anew reads the consent anew.
const std::string reopen = R"(, {"do": "close"}, {"do": "open"})";

TEST(PlayConsent, WhatIsSetIsThereWhenThePageIsOpenedAgain) {
    EXPECT_EQ(valuesOf("{}", set + get + reopen + get), "off off ");
}

TEST(PlayConsent, ARefusalLeavesTheSwitchWhereItIsUntilThePageIsOpenedAgain) {
    EXPECT_EQ(valuesOf(R"({"consentSet": [false]})", set + get + reopen + get), "off on ");
}

TEST(PlayConsent, RefusalsAreUsedUpOneACall) {
    EXPECT_EQ(valuesOf(R"({"consentSet": [null, false]})", set + reopen + get), "off ");
    EXPECT_EQ(valuesOf(R"({"consentSet": [false, null, false]})",
                       set + reopen + get + set + reopen + get),
              "on off ");
}

TEST(PlayConsent, AChangePlansRefusalsAnew) {
    EXPECT_EQ(
        valuesOf("{}", R"(, {"do": "change", "device": {"faults": {"consentSet": [false]}}})" +
                           set + reopen + get),
        "on ");
    EXPECT_EQ(valuesOf(R"({"consentSet": [false]})",
                       R"(, {"do": "change", "device": {"faults": {}}})" + set + reopen + get),
              "off ");
}

TEST(PlayConsent, ChangedConsentShowsWhenThePageReadsItAgainAndNotBefore) {
    EXPECT_EQ(valuesOf("{}", R"(, {"do": "change", "device": {"consent": [
                                    {"service": "kPRVServiceBrackwater", "bundle": "a",
                                     "granted": false}]}})" +
                                 get + reopen + get),
              "on off ");
}

} // namespace
} // namespace nimbra::test
