#include "device/json/JsonReader.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <functional>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

JsonReader reading(const std::string& text) {
    auto reader = JsonReader::parse(text, "FILE");
    EXPECT_TRUE(reader) << reader.error();
    return *reader;
}

std::string parseFailure(const std::string& text) {
    const auto reader = JsonReader::parse(text, "FILE");
    return reader ? "no error" : reader.error().description;
}

std::string problemOf(const JsonReader& reader) {
    const auto problem = reader.problem();
    return problem ? problem->description : "no problem";
}

TEST(JsonReaderTest, ValuesOfTheExpectedTypesAreGivenWithoutAProblem) {
    const JsonReader reader = reading(
        R"({"b": true, "i": -7, "n": 2.5, "s": "text", "z": null, "a": [1, 2], "o": {"k": "v"}})");

    EXPECT_TRUE(reader.member("b").boolean());
    EXPECT_EQ(reader.member("i").integer(), -7);
    EXPECT_EQ(reader.member("n").number(), 2.5);
    EXPECT_EQ(reader.member("i").number(), -7);
    EXPECT_EQ(reader.member("s").string(), "text");
    EXPECT_EQ(reader.member("s").stringOrNull(), "text");
    EXPECT_EQ(reader.member("z").stringOrNull(), std::nullopt);
    EXPECT_EQ(reader.member("a").elements().at(1).integer(), 2);
    EXPECT_EQ(reader.member("o").member("k").string(), "v");
    EXPECT_EQ(problemOf(reader), "no problem");
}

TEST(JsonReaderTest, WhereNothingStandsTheFallbackIsGiven) {
    const JsonReader reader = reading("{}");
    const JsonReader absent = reader.member("a").member("b");

    EXPECT_TRUE(absent.isAbsent());
    EXPECT_TRUE(absent.isNull());
    EXPECT_TRUE(absent.boolean(true));
    EXPECT_EQ(absent.integer(5), 5);
    EXPECT_EQ(absent.number(5.5), 5.5);
    EXPECT_EQ(absent.string("fallback"), "fallback");
    EXPECT_EQ(absent.stringOrNull(), std::nullopt);
    EXPECT_TRUE(absent.elements().empty());
    EXPECT_TRUE(absent.keys().empty());
    EXPECT_TRUE(absent.value().is_null());
    EXPECT_EQ(problemOf(reader), "no problem");
}

TEST(JsonReaderTest, AWrongTypeIsReportedWithItsPlaceAndWhatStandsThere) {
    struct Case {
        std::string text;
        std::function<void(const JsonReader&)> read;
        std::string message;
    };
    const std::vector<Case> cases{
        {R"({"apps": [{}, {}, {}, {"name": 7}]})",
         [](const auto& r) { (void)r.member("apps").elements().at(3).member("name").string(); },
         "FILE: /apps/3/name: expected a string, found 7"},
        {R"({"a": "x"})", [](const auto& r) { (void)r.member("a").boolean(); },
         "FILE: /a: expected true or false, found \"x\""},
        {R"({"a": null})", [](const auto& r) { (void)r.member("a").boolean(); },
         "FILE: /a: expected true or false, found null"},
        {R"({"a": 7.5})", [](const auto& r) { (void)r.member("a").integer(); },
         "FILE: /a: expected an integer, found 7.5"},
        {R"({"a": 18446744073709551615})", [](const auto& r) { (void)r.member("a").integer(); },
         "FILE: /a: expected an integer, found 18446744073709551615"},
        {R"({"a": []})", [](const auto& r) { (void)r.member("a").number(); },
         "FILE: /a: expected a number, found []"},
        {R"({"a": 1})", [](const auto& r) { (void)r.member("a").stringOrNull(); },
         "FILE: /a: expected a string or null, found 1"},
        {R"({"a": {"b": 1}})", [](const auto& r) { (void)r.member("a").elements(); },
         R"(FILE: /a: expected an array, found {"b":1})"},
        {R"([1])", [](const auto& r) { (void)r.member("a"); },
         "FILE: /: expected an object, found [1]"},
        {R"({"a": false})", [](const auto& r) { (void)r.member("a").keys(); },
         "FILE: /a: expected an object, found false"},
        {R"({})", [](const auto& r) { r.member("a").expected("something"); },
         "FILE: /a: expected something, found nothing"},
        {R"({"a~b/c": 1})", [](const auto& r) { (void)r.member("a~b/c").string(); },
         "FILE: /a~0b~1c: expected a string, found 1"},
        {"{\"line\\nbreak\": 1}", [](const auto& r) { (void)r.member("line\nbreak").string(); },
         "FILE: /line break: expected a string, found 1"},
    };
    for (const Case& example : cases) {
        const JsonReader reader = reading(example.text);
        example.read(reader);
        EXPECT_EQ(problemOf(reader), example.message);
    }
}

TEST(JsonReaderTest, OnlyTheFirstProblemIsKept) {
    const JsonReader reader = reading(R"({"a": 1, "b": 2})");

    (void)reader.member("b").string();
    (void)reader.member("a").string();

    EXPECT_EQ(problemOf(reader), "FILE: /b: expected a string, found 2");
}

TEST(JsonReaderTest, AnUnknownKeyIsReportedWithTheKnownOnes) {
    const JsonReader reader = reading(R"({"device": {"name": "x", "colour": "red"}})");

    reader.member("device").allowOnly({"name", "idiom"});

    EXPECT_EQ(problemOf(reader), "FILE: /device/colour: unknown key; expected one of name, idiom");
}

TEST(JsonReaderTest, ALongValueIsCutBetweenTwoCharacters) {
    // 59 one-byte characters, the quotation mark among them, then one of three bytes across the cut
    const JsonReader reader = reading("{\"a\": \"" + std::string(58, 'x') + "€uro\"}");

    (void)reader.member("a").integer();

    EXPECT_EQ(problemOf(reader),
              "FILE: /a: expected an integer, found \"" + std::string(58, 'x') + "...");
}

TEST(JsonReaderTest, BrokenJsonIsReportedWithLineAndColumn) {
    EXPECT_EQ(parseFailure("{\n  \"a\": nul\n}"),
              "FILE: line 2, column 11: not JSON: syntax error while parsing value - "
              "invalid literal");
    EXPECT_EQ(parseFailure("{\"ä\" 1}"),
              "FILE: line 1, column 6: not JSON: syntax error while parsing object separator - "
              "unexpected number literal; expected ':'");
    EXPECT_EQ(parseFailure(""),
              "FILE: line 1, column 1: not JSON: syntax error while parsing value - unexpected end "
              "of input; expected '[', '{', or a literal");
    EXPECT_EQ(parseFailure("{} {}"),
              "FILE: line 1, column 4: not JSON: syntax error while parsing value - unexpected "
              "'{'; expected end of input");
    EXPECT_EQ(parseFailure("[1e999]"),
              "FILE: line 1, column 6: not JSON: number overflow parsing '1e999'");
}

TEST(JsonReaderTest, BytesThatAreNotUtf8AreReportedInOneCleanLine) {
    EXPECT_EQ(parseFailure("{\"\xff\": 1}"),
              "FILE: line 1, column 3: not JSON: syntax error while parsing object key - invalid "
              "string: ill-formed UTF-8 byte");
}

TEST(JsonReaderTest, AKeyGivenTwiceIsReportedWithItsPlace) {
    EXPECT_EQ(parseFailure(R"({"a": [0, {"x/y": 1, "b": 2, "x/y": 1}]})"),
              "FILE: /a/1/x~1y: the key is given twice");
    EXPECT_EQ(problemOf(reading(R"([{"a": 1}, {"a": 1}])")), "no problem");
}

TEST(JsonReaderTest, ValuesNestedTooDeepAreReported) {
    EXPECT_EQ(parseFailure(std::string(100000, '[')),
              "FILE: the values are nested more than 100 deep");
    EXPECT_EQ(problemOf(reading(std::string(100, '[') + std::string(100, ']'))), "no problem");
}

TEST(JsonReaderTest, KeysStandInTheOrderOfTheFile) {
    EXPECT_EQ(reading(R"({"z": 1, "a": 2, "m": 3})").keys(),
              (std::vector<std::string>{"z", "a", "m"}));
}

TEST(JsonReaderTest, AFileThatCannotBeReadIsNamed) {
    const test::TemporaryDirectory directory;

    const auto missing = JsonReader::readFile(directory.path() / "missing.json");
    const auto folder = JsonReader::readFile(directory.path());

    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.error().description, (directory.path() / "missing.json").string() +
                                               ": cannot be read: No such file or directory");
    ASSERT_FALSE(folder);
    EXPECT_EQ(folder.error().description, directory.path().string() + ": is a directory");
}

TEST(JsonReaderTest, AFileIsReadUnderItsName) {
    const test::TemporaryDirectory directory;
    const auto path = directory.path() / "some.json";
    test::writeTestFile(path, R"({"a": 1})");

    const auto reader = JsonReader::readFile(path);

    ASSERT_TRUE(reader);
    (void)reader->member("a").string();
    EXPECT_EQ(problemOf(*reader), path.string() + ": /a: expected a string, found 1");
}

} // namespace
} // namespace nimbra::device
