#include "device/description/ApplicationEntries.h"

#include "device/apps/DesktopEntry.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <map>
#include <string>
#include <utility>

namespace nimbra::device {
namespace {

using Applications = std::vector<DeviceDescription::Application>;
using Tree = std::map<std::string, std::string>;

std::string entryNamed(const std::string& value) {
    return "[Desktop Entry]\nType=Application\nName=" + value + '\n';
}

TEST(DesktopEntryOf, AnApplicationHasATypeAndAName) {
    EXPECT_EQ(desktopEntryOf({.identifier = "com.a", .name = "Notes"}), entryNamed("Notes"));
}

TEST(DesktopEntryOf, ARemovedApplicationIsHidden) {
    EXPECT_EQ(desktopEntryOf({.identifier = "com.a", .name = "Notes", .removedSystemApp = true}),
              entryNamed("Notes") + "Hidden=true\n");
}

TEST(DesktopEntryOf, EntitlementsStandOnOneLineWithTheirTypes) {
    const auto entitlements =
        nlohmann::json::parse(R"({"flag": true, "text": "1", "number": 1, "fraction": 1.0,
                                  "none": null, "list": [1, {"b": []}]})");

    EXPECT_EQ(desktopEntryOf({.identifier = "com.a", .name = "A", .entitlements = entitlements}),
              entryNamed("A") + R"(X-Nimbra-Entitlements={"flag":true,"fraction":1.0,)"
                                R"("list":[1,{"b":[]}],"none":null,"number":1,"text":"1"})"
                                "\n");
}

TEST(DesktopEntryOf, BackslashesQuotesAndLineEndsInEntitlementsAreEscapedTwice) {
    const nlohmann::json entitlements{{"k\n", R"(\ " )"}};

    EXPECT_EQ(desktopEntryOf({.identifier = "com.a", .name = "A", .entitlements = entitlements}),
              entryNamed("A") + R"(X-Nimbra-Entitlements={"k\\n":"\\\\ \\" "})" + '\n');
}

TEST(DesktopEntryOf, WhatAnApplicationIsGivenIsReadBackFromItsEntry) {
    const std::string odd = "  \" \\ \\n \\\\s\n\t\r 😀 \u202Eدفتر ملاحظات\u202C \\";
    const DeviceDescription::Application application{
        .identifier = "com.a",
        .name = odd,
        .removedSystemApp = true,
        .entitlements = {{odd, odd}, {"flag", true}, {"number", 7}, {"list", {odd, nullptr}}}};

    const DesktopEntry entry = DesktopEntry::read(desktopEntryOf(application), {});

    EXPECT_TRUE(entry.isApplication);
    EXPECT_TRUE(entry.isHidden);
    EXPECT_EQ(entry.name, odd);
    EXPECT_TRUE(entry.problems.empty());
    EXPECT_EQ(entry.entitlements, (Entitlements{{odd, {odd}},
                                                {"flag", {true}},
                                                {"number", {std::int64_t{7}}},
                                                {"list", {EntitlementArray{{odd}, {}}}}}));
}

class EscapedNameTest : public testing::TestWithParam<std::pair<std::string, std::string>> {};

TEST_P(EscapedNameTest, StandsOnOneLine) {
    const auto& [name, value] = GetParam();
    EXPECT_EQ(desktopEntryOf({.identifier = "com.a", .name = name}), entryNamed(value));
}

INSTANTIATE_TEST_SUITE_P(
    Names, EscapedNameTest,
    testing::Values(std::pair{"", ""}, std::pair{" ", "\\s"}, std::pair{"   ", "\\s\\s\\s"},
                    std::pair{"  two words ", "\\s\\stwo words\\s"}, std::pair{"a  b", "a  b"},
                    std::pair{" \n ", "\\s\\n\\s"}, std::pair{"a\nb\tc\rd", "a\\nb\\tc\\rd"},
                    std::pair{"\\n", "\\\\n"}, std::pair{"C:\\", "C:\\\\"},
                    std::pair{"[Name]=x;#", "[Name]=x;#"}, std::pair{"\"quoted\"", "\"quoted\""},
                    std::pair{"😀 دفتر", "😀 دفتر"}));

class ApplicationEntriesTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path directory() const { return _directory.path(); }
    [[nodiscard]] Tree tree() const { return test::treeOf(directory()); }

    void replace(const Applications& applications) const {
        const auto replaced = replaceApplicationEntries(directory(), applications);
        ASSERT_TRUE(replaced) << replaced.error();
    }

private:
    test::TemporaryDirectory _directory;
};

const Applications two{{.identifier = "com.a", .name = "A"}, {.identifier = "com.b", .name = "B"}};
const Tree filesOfTwo{{"com.a.desktop", entryNamed("A")}, {"com.b.desktop", entryNamed("B")}};

TEST_F(ApplicationEntriesTest, EachApplicationHasAFileNamedAfterItsIdentifier) {
    ASSERT_TRUE(writeApplicationEntries(directory(), two));

    EXPECT_EQ(tree(), filesOfTwo);
}

TEST_F(ApplicationEntriesTest, AnIdentifierNeverLeadsOutOfTheFolder) {
    ASSERT_TRUE(writeApplicationEntries(directory(), {{.identifier = "../../com.a", .name = "A"},
                                                      {.identifier = "com/b", .name = "B"},
                                                      {.identifier = "50%", .name = "C"}}));

    EXPECT_EQ(tree(), (Tree{{"..%2F..%2Fcom.a.desktop", entryNamed("A")},
                            {"50%25.desktop", entryNamed("C")},
                            {"com%2Fb.desktop", entryNamed("B")}}));
}

TEST_F(ApplicationEntriesTest, AnEntryThatCannotBeWrittenIsReported) {
    const std::string name(300, 'x');

    const auto written = writeApplicationEntries(directory(), {{.identifier = name, .name = "A"}});

    ASSERT_FALSE(written);
    EXPECT_EQ(written.error().description, (directory() / (name + ".desktop")).string() +
                                               ": cannot be written: File name too long");
}

TEST_F(ApplicationEntriesTest, ReplacingLeavesTheGivenEntriesOnlyAndFilesOfOtherKinds) {
    test::writeTestFile(directory() / "com.a.desktop", "old");
    test::writeTestFile(directory() / "com.gone.desktop", "old");
    test::writeTestFile(directory() / ".desktop", "old");
    test::writeTestFile(directory() / "mimeinfo.cache", "kept");
    test::writeTestFile(directory() / "folder/com.c.desktop", "kept");

    replace(two);

    Tree expected = filesOfTwo;
    expected["mimeinfo.cache"] = "kept";
    expected["folder"] = "directory";
    expected["folder/com.c.desktop"] = "kept";
    EXPECT_EQ(tree(), expected);
}

TEST_F(ApplicationEntriesTest, ReplacingMakesTheFolderWhereItIsMissing) {
    const auto missing = directory() / "usr/share/applications";

    ASSERT_TRUE(replaceApplicationEntries(missing, two));

    EXPECT_EQ(test::treeOf(missing), filesOfTwo);
}

TEST_F(ApplicationEntriesTest, AnEntryThatStaysTheSameIsNotWrittenAgain) {
    replace(two);
    const auto time = std::filesystem::file_time_type::clock::now() - std::chrono::hours(1);
    std::filesystem::last_write_time(directory() / "com.a.desktop", time);
    std::filesystem::last_write_time(directory() / "com.b.desktop", time);

    replace({two[0], {.identifier = "com.b", .name = "Other"}});

    EXPECT_EQ(std::filesystem::last_write_time(directory() / "com.a.desktop"), time);
    EXPECT_NE(std::filesystem::last_write_time(directory() / "com.b.desktop"), time);
}

TEST_F(ApplicationEntriesTest, ALinkInAnEntrysPlaceIsReplacedAndWhatItNamesStays) {
    const auto elsewhere = directory() / "elsewhere.txt";
    test::writeTestFile(elsewhere, entryNamed("A"));
    std::filesystem::create_symlink(elsewhere, directory() / "com.a.desktop");

    replace({{.identifier = "com.a", .name = "A"}});

    EXPECT_FALSE(std::filesystem::is_symlink(directory() / "com.a.desktop"));
    EXPECT_EQ(tree(),
              (Tree{{"com.a.desktop", entryNamed("A")}, {"elsewhere.txt", entryNamed("A")}}));
}

TEST_F(ApplicationEntriesTest, AnEntryThatCannotBeReplacedIsReportedAndStays) {
    replace(two);
    {
        const test::ReadOnly readOnly(directory());

        const auto replaced =
            replaceApplicationEntries(directory(), {{.identifier = "com.a", .name = "Other"}});

        ASSERT_FALSE(replaced);
        EXPECT_EQ(replaced.error().description, (directory() / "com.a.desktop").string() +
                                                    ": cannot be written: Permission denied");
    }
    EXPECT_EQ(tree(), filesOfTwo);
}

TEST_F(ApplicationEntriesTest, AnEntryThatCannotBeRemovedIsReported) {
    test::writeTestFile(directory() / "com.gone.desktop/taken", "");

    const auto replaced = replaceApplicationEntries(directory(), {});

    ASSERT_FALSE(replaced);
    EXPECT_EQ(replaced.error().description, (directory() / "com.gone.desktop").string() +
                                                ": cannot be removed: Directory not empty");
}

TEST_F(ApplicationEntriesTest, AFolderThatCannotBeMadeIsReported) {
    test::writeTestFile(directory() / "usr", "a file");
    const auto folder = directory() / "usr/share/applications";

    const auto replaced = replaceApplicationEntries(folder, two);

    ASSERT_FALSE(replaced);
    EXPECT_EQ(replaced.error().description, folder.string() + ": cannot be made: Not a directory");
}

} // namespace
} // namespace nimbra::device
