#pragma once

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {

/// Where the scenarios that come with the program stand, each with its trace.
inline std::filesystem::path sampleScenarios() {
    return NIMBRA_SAMPLES;
}

/// Their names, without the ending of their files.
inline std::vector<std::string> namesOfSampleScenarios() {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(sampleScenarios())) {
        if (entry.path().extension() == ".json") {
            names.push_back(entry.path().stem());
        }
    }
    return names;
}

/// The name of a scenario as tests may be called.
inline std::string testNameOf(const testing::TestParamInfo<std::string>& scenario) {
    std::string name = scenario.param;
    std::ranges::replace(name, '-', '_');
    return name;
}

} // namespace nimbra::test
