#include "tests/house/Command.h"

#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <regex>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

/// The shared objects that the one at `path` asks for.
std::vector<std::string> neededBy(const std::string& path) {
    const CommandResult result = run({"env", "LC_ALL=C", "readelf", "--dynamic", "--wide", path});
    EXPECT_EQ(result.status, 0) << result.output;
    const std::regex entry(R"(\(NEEDED\)\s+Shared library: \[(.*)\])");
    std::vector<std::string> needed;
    for (std::sregex_iterator found(result.output.begin(), result.output.end(), entry), end;
         found != end; ++found) {
        needed.push_back((*found)[1]);
    }
    return needed;
}

class BundleDependencies : public testing::TestWithParam<const char*> {};

TEST_P(BundleDependencies, ABundleNeedsThePlatformTheRuntimeAndLibcOnly) {
    const std::string allowed =
        R"((libnimbra-platform|libstdc\+\+|libgcc_s|libc|libm|ld-linux.*)\.so\..*)";

    const std::vector<std::string> needed = neededBy(GetParam());

    EXPECT_THAT(needed, testing::Each(testing::Truly([&](const std::string& name) {
                    return std::regex_match(name, std::regex(allowed));
                })));
    EXPECT_THAT(needed, testing::Contains(testing::StartsWith("libnimbra-platform.so")));
}

INSTANTIATE_TEST_SUITE_P(Every, BundleDependencies,
                         testing::Values(NIMBRA_BUNDLE_OBJECT, NIMBRA_DATABASE_BUNDLE_OBJECT),
                         [](const auto& object) {
                             return std::filesystem::path(object.param).stem().string();
                         });

} // namespace
} // namespace nimbra::test
