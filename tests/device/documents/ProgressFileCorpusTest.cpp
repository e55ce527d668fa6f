#include "device/documents/ProgressFile.h"
#include "tests/device/TestFiles.h"
#include "tests/fuzz/ProgressChecks.h"

#include <gtest/gtest.h>

// Reads the files from which the fuzzer sets out.

namespace nimbra::test {
namespace {

TEST(ProgressFileCorpusTest, OnlyGoodFilesAreRead) {
    int good = 0;
    int bad = 0;
    for (const auto& [name, content] :
         treeOf(std::filesystem::path(NIMBRA_CORPUS) / "progress-file")) {
        SCOPED_TRACE(name);
        const bool isGood = name.starts_with("good-");
        EXPECT_TRUE(isGood || name.starts_with("bad-"));
        ++(isGood ? good : bad);
        EXPECT_EQ(faultInProgressFile(content), "");
        EXPECT_EQ(device::parseProgressFile(content, name).has_value(), isGood);
    }
    EXPECT_GT(good, 0);
    EXPECT_GT(bad, 0);
}

} // namespace
} // namespace nimbra::test
