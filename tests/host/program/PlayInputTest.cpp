#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

/// Plays `scenario` as the file "bad.json" and expects that it is refused with one line that
/// starts with the file and `place` and holds `reason`.
void expectRefused(const std::string& scenario, const std::string& place,
                   const std::string& reason) {
    const Program program;
    const auto file = program.write("bad.json", scenario);

    const auto result = program.run({"play", file.string()});

    SCOPED_TRACE(scenario);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1) << result.messages;
    EXPECT_TRUE(result.messages.starts_with("settingsctl: " + file.string() + ": " + place))
        << result.messages;
    EXPECT_NE(result.messages.find(reason), std::string::npos) << result.messages;
    EXPECT_TRUE(program.leftNothingBehind());
}

std::string withStep(const std::string& step) {
    return R"({"steps": [{"do": "open"}, )" + step + "]}";
}

TEST(ScenarioInput, BrokenJsonIsRefusedWithItsPlace) {
    expectRefused("{\"steps\": [\n  {\"do\": open}\n]}", "", "line 2");
    expectRefused("", "", "line 1");
    expectRefused("\xff\xfe", "", "line 1");
}

TEST(ScenarioInput, ASecondValueForOneKeyIsRefused) {
    expectRefused(R"({"steps": [], "steps": []})", "", "steps");
}

TEST(ScenarioInput, AWrongTypeIsRefusedWithItsPlace) {
    expectRefused("[]", "/: ", "expected an object");
    expectRefused(R"({"steps": {}})", "/steps: ", "expected an array, found {}");
    expectRefused(R"({"steps": [1]})", "/steps/0: ", "found 1");
    expectRefused(R"({"steps": [], "device": {"name": 7}})", "/device/name: ", "found 7");
    expectRefused(R"({"steps": [], "entry": {"firstSetup": "yes"}})",
                  "/entry/firstSetup: ", "expected true, false or null");
    expectRefused(R"({"steps": [], "entry": {"account": 1}})", "/entry/account: ", "found 1");
    expectRefused(withStep(R"({"do": "get", "row": 3})"), "/steps/1/row: ", "found 3");
    expectRefused(withStep(R"({"do": "set", "row": "a", "value": "on"})"),
                  "/steps/1/value: ", "expected true or false, found \"on\"");
    expectRefused(withStep(R"({"do": "post", "name": "a", "userInfo": {"k": []}})"),
                  "/steps/1/userInfo/k: ", "found []");
    expectRefused(withStep(R"({"do": "post", "name": "a", "from": "elsewhere"})"),
                  "/steps/1/from: ", "\"main\", \"other\"");
    expectRefused(withStep(R"({"do": "post", "name": "a", "distributed": 1})"),
                  "/steps/1/distributed: ", "found 1");
    expectRefused(withStep(R"({"do": "change", "device": {"locale": "!"}})"),
                  "/steps/1/device/locale: ", "language tag");
}

TEST(ScenarioInput, AnUnknownKeyIsRefusedWithItsPlace) {
    expectRefused(R"({"steps": [], "stepz": 1})", "/stepz: ", "unknown key");
    expectRefused(R"({"steps": [], "device": {"colour": 1}})", "/device/colour: ", "unknown key");
    expectRefused(R"({"steps": [], "entry": {"first": 1}})", "/entry/first: ", "unknown key");
    expectRefused(withStep(R"({"do": "close", "now": true})"), "/steps/1/now: ", "unknown key");
    expectRefused(withStep(R"({"do": "footer", "row": "a"})"), "/steps/1/row: ", "unknown key");
}

TEST(ScenarioInput, AMissingKeyIsRefusedWithItsPlace) {
    expectRefused("{}", "/steps: ", "found nothing");
    expectRefused(withStep("{}"), "/steps/1/do: ", "found nothing");
    expectRefused(withStep(R"({"do": "get"})"), "/steps/1/row: ", "found nothing");
    expectRefused(withStep(R"({"do": "tap"})"), "/steps/1/row: ", "found nothing");
    expectRefused(withStep(R"({"do": "set", "row": "a"})"), "/steps/1/value: ", "found nothing");
    expectRefused(withStep(R"({"do": "post"})"), "/steps/1/name: ", "found nothing");
    expectRefused(withStep(R"({"do": "change"})"), "/steps/1/device: ", "found nothing");
    expectRefused(withStep(R"({"do": "moveFooter"})"), "/steps/1/window: ", "found nothing");
    expectRefused(withStep(R"({"do": "layout", "width": 1})"),
                  "/steps/1/height: ", "found nothing");
    expectRefused(withStep(R"({"do": "tapButton"})"), "/steps/1/title: ", "found nothing");
    expectRefused(withStep(R"({"do": "alert"})"), "/steps/1/choose: ", "found nothing");
    expectRefused(withStep(R"({"do": "share"})"), "/steps/1/outcome: ", "found nothing");
    expectRefused(withStep(R"({"do": "advance"})"), "/steps/1/seconds: ", "found nothing");
    expectRefused(withStep(R"({"do": "publishProgress"})"), "/steps/1/id: ", "found nothing");
    expectRefused(withStep(R"({"do": "unpublishProgress"})"), "/steps/1/id: ", "found nothing");
}

TEST(ScenarioInput, AnUnknownStepIsRefusedWithTheKnownOnes) {
    expectRefused(withStep(R"({"do": "dance"})"), "/steps/1/do: ", "found \"dance\"");
    expectRefused(withStep(R"({"do": "dance"})"), "/steps/1/do: ", "becomeActive");
}

TEST(ScenarioInput, AnEntryOnAnUnknownAccountIsRefused) {
    expectRefused(R"({"steps": [], "entry": {"account": "nobody"}})",
                  "/entry/account: ", "found \"nobody\"");
    expectRefused(R"({"device": {"accounts": [{"identifier": "a"}]}, "steps": [],
                      "entry": {"account": "primary"}})",
                  "/entry/account: ", "found \"primary\"");
}

TEST(ScenarioInput, AFileThatIsNotThereIsRefused) {
    const Program program;

    const auto result = program.run({"play", program.path("none.json").string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_NE(result.messages.find("none.json"), std::string::npos);
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1);
}

} // namespace
} // namespace nimbra::test
