#include "tests/host/program/Program.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

const std::filesystem::path samples = NIMBRA_SAMPLES;

std::vector<std::string> sampleNames() {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(samples)) {
        if (entry.path().extension() == ".json") {
            names.push_back(entry.path().stem());
        }
    }
    return names;
}

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

INSTANTIATE_TEST_SUITE_P(All, ScenarioSamples, testing::ValuesIn(sampleNames()),
                         [](const testing::TestParamInfo<std::string>& sample) {
                             std::string name = sample.param;
                             std::ranges::replace(name, '-', '_');
                             return name;
                         });

TEST(ScenarioSampleFiles, EveryTraceHasItsScenario) {
    for (const auto& entry : std::filesystem::directory_iterator(samples)) {
        auto scenario = entry.path();
        EXPECT_TRUE(std::filesystem::exists(scenario.replace_extension(".json"))) << entry.path();
    }
}

} // namespace
} // namespace nimbra::test
