#include "device/apps/EntitlementsReader.h"

#include <gtest/gtest.h>
#include <limits>
#include <string>

namespace nimbra::device {
namespace {

TEST(EntitlementsReaderTest, ValuesKeepTheirTypes) {
    const auto read = readEntitlements(
        R"({"yes": true, "one": 1, "low": -9223372036854775808, "half": 0.5, "whole": 1.0,
            "text": "true", "nothing": null, "list": [1, "a"], "dictionary": {"b": 1, "a": {}}})");

    ASSERT_TRUE(read) << read.error();
    EXPECT_EQ(
        *read,
        (Entitlements{
            {"yes", {true}},
            {"one", {std::int64_t{1}}},
            {"low", {std::numeric_limits<std::int64_t>::min()}},
            {"half", {0.5}},
            {"whole", {1.0}},
            {"text", {std::string("true")}},
            {"nothing", {}},
            {"list", {EntitlementArray{{std::int64_t{1}}, {std::string("a")}}}},
            {"dictionary",
             {EntitlementDictionary{{"b", {std::int64_t{1}}}, {"a", {EntitlementDictionary{}}}}}},
        }));
}

TEST(EntitlementsReaderTest, AWholeNumberThatIsTooLargeBecomesAFloatingOne) {
    const auto read =
        readEntitlements(R"({"most": 9223372036854775807, "more": 9223372036854775808})");

    ASSERT_TRUE(read) << read.error();
    EXPECT_EQ(read->at("most").value, EntitlementValue{std::int64_t{9223372036854775807}}.value);
    EXPECT_EQ(read->at("more").value, EntitlementValue{9223372036854775808.0}.value);
}

TEST(EntitlementsReaderTest, AnEmptyObjectGrantsNothing) {
    const auto read = readEntitlements("{}");

    ASSERT_TRUE(read) << read.error();
    EXPECT_TRUE(read->empty());
}

TEST(EntitlementsReaderTest, WhatIsNoObjectIsAnError) {
    const auto errorOf = [](std::string_view json) {
        const auto read = readEntitlements(json);
        return read ? "no error" : read.error().description;
    };
    EXPECT_EQ(errorOf("[true]"), "entitlements: /: expected an object, found [true]");
    EXPECT_EQ(errorOf("null"), "entitlements: /: expected an object, found null");
    EXPECT_EQ(errorOf(R"({"a": yes})"),
              "entitlements: line 1, column 7: not JSON: syntax error while parsing value - "
              "invalid literal");
    EXPECT_TRUE(errorOf("").starts_with("entitlements: line 1, column 1: not JSON: "));
    EXPECT_EQ(errorOf(R"({"a": 1, "a": 2})"), "entitlements: /a: the key is given twice");
    EXPECT_EQ(errorOf(R"({"a": )" + std::string(100, '[') + std::string(100, ']') + "}"),
              "entitlements: the values are nested more than 100 deep");
}

} // namespace
} // namespace nimbra::device
