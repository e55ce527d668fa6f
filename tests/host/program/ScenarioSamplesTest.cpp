#include "tests/host/SampleScenarios.h"
#include "tests/host/program/Program.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

const std::filesystem::path samples = sampleScenarios();

class ScenarioSamples : public testing::TestWithParam<std::string> {};

TEST_P(ScenarioSamples, PlayAsTheirTraceSays) {
    const Program program;
    const auto expected = samples / (GetParam() + ".trace");
    ASSERT_TRUE(std::filesystem::exists(expected));

    const auto result = program.run({"play", (samples / (GetParam() + ".json")).string()});

    EXPECT_EQ(result.output, readWhole(expected));
    EXPECT_EQ(result.messages, "");
    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(program.leftNothingBehind());
}

INSTANTIATE_TEST_SUITE_P(All, ScenarioSamples, testing::ValuesIn(namesOfSampleScenarios()),
                         testNameOf);

TEST(ScenarioSampleFiles, EveryTraceHasItsScenario) {
    for (const auto& entry : std::filesystem::directory_iterator(samples)) {
        auto scenario = entry.path();
        EXPECT_TRUE(std::filesystem::exists(scenario.replace_extension(".json"))) << entry.path();
    }
}

} // namespace
} // namespace nimbra::test
