#include "tools/mrctl/JsonPseudonyms.h"

#include "tools/mrctl/Pseudonyms.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace nimbra::mrctl {
namespace {

using Json = nlohmann::ordered_json;

Json replaced(const Json& value) {
    Pseudonyms pseudonyms("/srv/phone");
    pseudonyms.setLearning(true);
    static_cast<void>(replacedInJson(value, pseudonyms));
    pseudonyms.setLearning(false);
    return replacedInJson(value, pseudonyms);
}

TEST(JsonPseudonymsTest, WhatIsNoSecretStays) {
    const Json value = Json::parse(R"({"log.level": 7, "list": [true, null, 1.5, "plain text"]})");

    EXPECT_EQ(replaced(value), value);
}

TEST(JsonPseudonymsTest, KeysThatNameSecretsHideAllBelowThem) {
    EXPECT_EQ(
        replaced(Json::parse(
            R"({"password": {"old": "abc", "pins": [1234, "xyz"], "on": true, "none": null}})")),
        Json::parse(R"({"password": {"old": "secret-1", "pins": ["secret-2", "secret-3"],
                                           "on": true, "none": null}})"));
}

TEST(JsonPseudonymsTest, KeysAreTextsToo) {
    EXPECT_EQ(replaced(Json::parse(R"({"ann@example.com": 1, "bob@example.com": 2})")),
              Json::parse(R"({"email-1": 1, "email-2": 2})"));
}

TEST(JsonPseudonymsTest, KeysThatBecomeTheSameStayApart) {
    EXPECT_EQ(replaced(Json::parse(R"({"email-2": 0, "ann@example.com": 1, "ann%40x": 2})")).size(),
              3U);
    EXPECT_EQ(replaced(Json::parse(R"({"email-1": 0, "ann@example.com": 1})")).size(), 2U);
}

TEST(JsonPseudonymsTest, ASecretUnderAKeyIsFoundInTexts) {
    EXPECT_EQ(replaced(Json::parse(R"({"note": "it is swordfish!", "secret": "swordfish"})")),
              Json::parse(R"({"note": "it is secret-1!", "secret": "secret-1"})"));
}

} // namespace
} // namespace nimbra::mrctl
