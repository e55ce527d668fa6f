#include "device/apps/DesktopEntry.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using namespace std::string_literals;
using Problems = std::vector<DesktopEntry::Problem>;

/// Reads `text` for a user in Austria.
DesktopEntry read(std::string_view text) {
    return DesktopEntry::read(text, {"de_AT", "de"});
}

/// Reads `lines` as those below the group's.
DesktopEntry entryWith(const std::string& lines) {
    return read("[Desktop Entry]\n" + lines);
}

std::string nameOf(const std::string& lines) {
    return entryWith(lines).name.value_or("none");
}

TEST(DesktopEntryTest, AnEntryTellsNameIconAndEntitlements) {
    const DesktopEntry entry = read(R"(# Notes
[Desktop Entry]
Type=Application
Name=Notes
Icon=org.example.notes
X-Nimbra-Entitlements={"hidden": true, "number": 1})");

    EXPECT_TRUE(entry.isApplication);
    EXPECT_EQ(entry.name, "Notes");
    EXPECT_EQ(entry.icon, "org.example.notes");
    EXPECT_FALSE(entry.isHidden);
    EXPECT_EQ(entry.entitlements,
              (Entitlements{{"hidden", {true}}, {"number", {std::int64_t{1}}}}));
    EXPECT_EQ(entry.problems, Problems{});
}

TEST(DesktopEntryTest, TheNameIsTheOneInTheUsersBestLanguage) {
    EXPECT_EQ(nameOf("Name[de]=D\nName[de_AT]=A\nName=N\n"), "A");
    EXPECT_EQ(nameOf("Name=N\nName[fr]=F\nName[de]=D\n"), "D");
    EXPECT_EQ(nameOf("Name=N\nName[fr]=F\n"), "N");
    EXPECT_EQ(nameOf("Name[de.UTF-8]=D\nName=N\n"), "D");
    EXPECT_EQ(
        DesktopEntry::read("[Desktop Entry]\nName=N\nName[sr@latin]=L\nName[sr]=C\n", {"sr@latin"})
            .name,
        "L");
    EXPECT_EQ(
        DesktopEntry::read("[Desktop Entry]\nName=N\nName[sr.UTF-8@latin]=L\n", {"sr@latin"}).name,
        "L");
}

TEST(DesktopEntryTest, ABlankNameCountsAsNone) {
    EXPECT_EQ(nameOf("Name[de_AT]= \nName[de]=\\s\\t\nName=N\n"), "N");
    const DesktopEntry entry = entryWith("Icon=i\nName=\\s\nName[de]=\u3000\n");
    EXPECT_EQ(entry.name, std::nullopt);
    EXPECT_EQ(entry.problems, (Problems{{3, "no usable Name"}}));
}

TEST(DesktopEntryTest, AnEntryWithoutANameSaysSoAndKeepsTheRest) {
    const DesktopEntry entry = read("\n[Desktop Entry]\nType=Application\nIcon=i\nName[fr]=F\n");

    EXPECT_TRUE(entry.isApplication);
    EXPECT_EQ(entry.name, std::nullopt);
    EXPECT_EQ(entry.icon, "i");
    EXPECT_EQ(entry.problems, (Problems{{2, "no usable Name"}}));
}

TEST(DesktopEntryTest, ARemovedApplicationNeedsNoName) {
    const DesktopEntry entry = entryWith("Hidden=true\n");

    EXPECT_TRUE(entry.isApplication);
    EXPECT_TRUE(entry.isHidden);
    EXPECT_EQ(entry.problems, Problems{});
}

TEST(DesktopEntryTest, HiddenIsTrueOrFalse) {
    EXPECT_FALSE(entryWith("Name=N\nHidden=false\n").isHidden);
    const DesktopEntry entry = entryWith("Name=N\nHidden=True\n");
    EXPECT_FALSE(entry.isHidden);
    EXPECT_EQ(entry.problems, (Problems{{3, "Hidden is neither true nor false"}}));
}

TEST(DesktopEntryTest, OnlyApplicationsAreApplications) {
    EXPECT_FALSE(entryWith("Type=Link\nURL=https://example.org/\n").isApplication);
    EXPECT_FALSE(entryWith("Type=Directory\nName=N\n").isApplication);
    EXPECT_EQ(entryWith("Type=Link\n").problems, Problems{});
    EXPECT_TRUE(entryWith("Name=N\n").isApplication);
}

TEST(DesktopEntryTest, WithoutItsGroupAFileIsNoApplication) {
    for (const char* const text : {"", "\n\n", "Name=N\n", "[Desktop Action a]\nName=N\n",
                                   "[Desktop Entry\nName=N\n", "[desktop entry]\nName=N\n"}) {
        const DesktopEntry entry = read(text);
        EXPECT_FALSE(entry.isApplication) << text;
        EXPECT_EQ(entry.name, std::nullopt) << text;
        EXPECT_EQ(entry.problems, (Problems{{1, "no group [Desktop Entry]"}})) << text;
    }
}

TEST(DesktopEntryTest, OtherGroupsAreSkippedWhateverTheyHold) {
    const DesktopEntry entry = read("Name=Before\nnothing\n[A]\nName=A\n[Desktop Entry]\nName=N\n"
                                    "[Desktop Action a]\nName[de]=Action\nnothing\n\xFF\n");

    EXPECT_EQ(entry.name, "N");
    EXPECT_EQ(entry.problems, Problems{});
}

TEST(DesktopEntryTest, OfTwoEntriesInAFileTheFirstCounts) {
    const DesktopEntry entry =
        read("[Desktop Entry]\nName=First\n\n[Desktop Entry]\nName[de]=Second\nHidden=true\n");

    EXPECT_EQ(entry.name, "First");
    EXPECT_FALSE(entry.isHidden);
    EXPECT_EQ(entry.problems,
              (Problems{{4, "[Desktop Entry] stands here again; the first one counts"}}));
}

TEST(DesktopEntryTest, OfTwoValuesOfAKeyTheFirstCounts) {
    const DesktopEntry entry = entryWith("Name=N\nIcon=i\nName=M\nName[de]=D\nName[de]=E\n");

    EXPECT_EQ(entry.name, "D");
    EXPECT_EQ(entry.problems, (Problems{{4, "Name stands here again; the first one counts"},
                                        {6, "Name[de] stands here again; the first one counts"}}));
}

TEST(DesktopEntryTest, ALineThatIsNoPairIsAProblemAndTheOthersStand) {
    const DesktopEntry entry = entryWith("nothing\n=value\n[open\nName=N\n");

    EXPECT_EQ(entry.name, "N");
    EXPECT_EQ(entry.problems, (Problems{{2, "not a key and its value"},
                                        {3, "not a key and its value"},
                                        {4, "not a key and its value"}}));
}

TEST(DesktopEntryTest, ALineInAnotherEncodingIsAProblemAndTheOthersStand) {
    const DesktopEntry entry = entryWith("# gr\xFC\xDF dich\nName[de]=\xDC"
                                         "bersicht\nName=Overview\n");

    EXPECT_EQ(entry.name, "Overview");
    EXPECT_EQ(entry.problems, (Problems{{3, "not UTF-8"}}));
}

TEST(DesktopEntryTest, AByteThatIsZeroIsAProblem) {
    const DesktopEntry entry = entryWith("Name=Z\0ero\nIcon=i\n"s);

    EXPECT_EQ(entry.icon, "i");
    EXPECT_EQ(entry.problems, (Problems{{1, "no usable Name"}, {2, "a byte that is zero"}}));
}

TEST(DesktopEntryTest, LinesOfOtherSystemsAreRead) {
    const DesktopEntry entry = read("\xEF\xBB\xBF[Desktop Entry]\r\n  Name \t= N m \r\n\r\n"
                                    "  # comment\r\nHidden=true\r\n");

    EXPECT_EQ(entry.name, "N m");
    EXPECT_TRUE(entry.isHidden);
    EXPECT_EQ(entry.problems, Problems{});
}

TEST(DesktopEntryTest, EscapesStandForWhatCannotStandInALine) {
    EXPECT_EQ(nameOf(R"(Name=\sa\nb\tc\rd\\n)"), " a\nb\tc\rd\\n");
    EXPECT_EQ(nameOf(R"(Name=a\;b\)"), R"(a\;b\)");
}

TEST(DesktopEntryTest, EntitlementsAreEscapedAsAnyValueIs) {
    const DesktopEntry entry =
        entryWith(R"(Name=N)"
                  "\n"
                  R"(X-Nimbra-Entitlements={"a":\s"x\\ny", "b": "\\u00e4", "c": "\""})");

    EXPECT_EQ(entry.problems, Problems{});
    EXPECT_EQ(entry.entitlements, (Entitlements{{"a", {std::string("x\ny")}},
                                                {"b", {std::string("ä")}},
                                                {"c", {std::string("\"")}}}));
}

TEST(DesktopEntryTest, EntitlementsThatCannotBeReadGrantNothing) {
    const DesktopEntry broken = entryWith("Name=N\nX-Nimbra-Entitlements={\"a\": tru\n");
    EXPECT_EQ(broken.name, "N");
    EXPECT_TRUE(broken.entitlements.empty());
    ASSERT_EQ(broken.problems.size(), 1U);
    EXPECT_EQ(broken.problems.front().line, 3U);
    EXPECT_TRUE(broken.problems.front().what.starts_with("entitlements: line 1, column "))
        << broken.problems.front().what;

    EXPECT_EQ(entryWith("Name=N\nX-Nimbra-Entitlements=7\n").problems,
              (Problems{{3, "entitlements: /: expected an object, found 7"}}));
    const std::string deep(5000, '[');
    EXPECT_EQ(entryWith("Name=N\nX-Nimbra-Entitlements={\"a\":" + deep + "}\n").problems,
              (Problems{{3, "entitlements: the values are nested more than 100 deep"}}));
}

TEST(DesktopEntryTest, OfManyProblemsTheFirstAreToldAndTheOthersCounted) {
    std::string lines;
    for (int line = 0; line < 1000; ++line) {
        lines += "nothing\n";
    }
    const DesktopEntry entry = entryWith(lines);

    ASSERT_EQ(entry.problems.size(), 12U);
    EXPECT_EQ(entry.problems[0], (DesktopEntry::Problem{1, "no usable Name"}));
    EXPECT_EQ(entry.problems[10], (DesktopEntry::Problem{11, "not a key and its value"}));
    EXPECT_EQ(entry.problems[11],
              (DesktopEntry::Problem{12, "and 990 more problems from here on"}));
}

} // namespace
} // namespace nimbra::device
