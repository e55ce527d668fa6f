#include "device/apps/DesktopEntry.h"
#include "device/apps/EntitlementsReader.h"
#include "tests/device/TestFiles.h"
#include "tests/fuzz/EntryChecks.h"

#include <gtest/gtest.h>

// Reads the files from which the fuzzers set out.

namespace nimbra::test {
namespace {

/// Calls `check` with the content of each file of a corpus and whether it is a good one.
template <class Check>
void forEachOf(const std::string& corpus, const Check& check) {
    int good = 0;
    int bad = 0;
    for (const auto& [name, content] : treeOf(std::filesystem::path(NIMBRA_CORPUS) / corpus)) {
        SCOPED_TRACE(name);
        const bool isGood = name.starts_with("good-");
        EXPECT_TRUE(isGood || name.starts_with("bad-"));
        ++(isGood ? good : bad);
        check(content, isGood);
    }
    EXPECT_GT(good, 0);
    EXPECT_GT(bad, 0);
}

TEST(EntryCorpusTest, OfEveryEntryTheProblemsAreTold) {
    forEachOf("desktop-entry", [](const std::string& content, bool isGood) {
        EXPECT_EQ(faultInEntry(content), "");
        EXPECT_EQ(device::DesktopEntry::read(content, {"de"}).problems.empty(), isGood);
    });
}

TEST(EntryCorpusTest, OnlyGoodEntitlementsAreRead) {
    forEachOf("entitlements", [](const std::string& content, bool isGood) {
        EXPECT_EQ(faultInEntitlements(content), "");
        EXPECT_EQ(device::readEntitlements(content).has_value(), isGood);
    });
}

} // namespace
} // namespace nimbra::test
