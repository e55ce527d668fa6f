#include "host/cli/ListText.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::cli {
namespace {

using host::RowDescription;
using host::RowKind;

RowDescription row(RowKind kind, Text name, RowValue value = {}) {
    return {.kind = kind,
            .id = {},
            .name = std::move(name),
            .enabled = true,
            .value = std::move(value),
            .footer = {},
            .footerClass = {},
            .icon = {},
            .detail = {}};
}

RowDescription group(Text footer = {}) {
    RowDescription description = row(RowKind::group, {});
    description.footer = std::move(footer);
    return description;
}

const ListText text({.width = 30, .isStyled = false});

TEST(ListText, PutsValuesAtTheRightEdge) {
    EXPECT_EQ(text.page("Page", {row(RowKind::switchRow, "Short", true),
                                 row(RowKind::switchRow, "書類", false)}),
              "Page\n"
              "\n"
              "  Short                     on\n"
              "  書類                     off\n");
}

TEST(ListText, KeepsALongNameApartFromItsValue) {
    EXPECT_EQ(text.page("Page", {row(RowKind::switchRow, "A name that is far too long", true)}),
              "Page\n"
              "\n"
              "  A name that is far too long  on\n");
}

TEST(ListText, PartsGroupsAndPutsFootersBelow) {
    EXPECT_EQ(
        text.page("Page", {group("What this group is all about."), row(RowKind::button, "One"),
                           group(), row(RowKind::link, "Two", Text("3 apps"))}),
        "Page\n"
        "\n"
        "  [One]\n"
        "    What this group is all\n"
        "    about.\n"
        "\n"
        "  Two                 3 apps ›\n");
}

TEST(ListText, ShowsNothingOfAGroupWithoutRowsButItsFooter) {
    EXPECT_EQ(text.page("Page", {group(), group("Alone."), group()}), "Page\n\n    Alone.\n");
}

TEST(ListText, MarksLockedRowsAndRowsWithoutAName) {
    RowDescription locked = row(RowKind::switchRow, {}, false);
    locked.enabled = false;

    EXPECT_EQ(text.page("Page", {locked}), "Page\n\n  (no name) (locked)       off\n");
}

RowDescription named(Text identifier, Text name) {
    RowDescription description = row(RowKind::switchRow, std::move(name), true);
    description.id = std::move(identifier);
    return description;
}

TEST(ListText, TellsRowsOfTheSameNameApartByTheirIdentifiers) {
    RowDescription locked = named("d", "Notes");
    locked.enabled = false;
    RowDescription heading = group();
    heading.name = "Clock";

    EXPECT_EQ(text.page("Page", {heading, named("a", "Notes"), named("b", "Clock"), locked,
                                 named(nullptr, "Notes")}),
              "Page\n"
              "\n"
              "  Notes (a)                 on\n"
              "  Clock                     on\n"
              "  Notes (d) (locked)        on\n"
              "  Notes                     on\n");
}

TEST(ListText, LetsNoIdentifierMoveTheCursor) {
    EXPECT_EQ(text.page("Page", {named("a\x1b[2J", "Notes"), named("b", "Notes")}).find('\x1b'),
              std::string::npos);
}

TEST(ListText, LetsNoNameMoveTheCursor) {
    EXPECT_EQ(text.page("P\x1b[1m", {row(RowKind::link, "a\nb", Text("c\r"))}).find('\x1b'),
              std::string::npos);
}

TEST(ListText, IsBoldAndDimOnlyWhereThatIsWanted) {
    const ListText styled({.width = 30, .isStyled = true});

    EXPECT_EQ(styled.page("Page", {group("Alone.")}),
              "\x1b[1mPage\x1b[0m\n\n    \x1b[2mAlone.\x1b[0m\n");
}

TEST(ListText, TellsWhatCameWentAndChanged) {
    const std::vector<RowDescription> before{group(), row(RowKind::switchRow, "Notes", true),
                                             row(RowKind::button, "Gone"),
                                             row(RowKind::button, "Stays")};
    const std::vector<RowDescription> after{row(RowKind::switchRow, "Notes", false),
                                            row(RowKind::button, "Stays"),
                                            row(RowKind::button, "New"), group("Footer")};

    EXPECT_EQ(text.changes(before, after), "- [Gone]\n"
                                           "~ Notes                    off\n"
                                           "+ [New]\n");
    EXPECT_EQ(text.changes(after, after), "");
}

TEST(ListText, TellsWhichOfSeveralRowsOfTheSameNameHasChanged) {
    RowDescription off = named("b", "Notes");
    off.value = false;

    EXPECT_EQ(text.changes({named("a", "Notes"), named("b", "Notes"), named("c", "Notes")},
                           {named("a", "Notes"), off}),
              "- Notes (c)\n"
              "~ Notes (b)                off\n");
    EXPECT_EQ(text.changes({named("a", "Notes")}, {named("a", "Notes"), named("b", "Notes")}),
              "+ Notes (b)                 on\n");
}

TEST(ListText, TellsARowFromOneOfAnotherKindThatIsCalledTheSame) {
    EXPECT_EQ(text.changes({row(RowKind::button, "Notes")}, {row(RowKind::link, "Notes")}),
              "- [Notes]\n"
              "+ Notes                      ›\n");
}

TEST(ListText, FindsAChangeAmongManyRows) {
    std::vector<RowDescription> before;
    for (int number = 0; number < 20'000; ++number) {
        before.push_back(named("id." + std::to_string(number), "App " + std::to_string(number)));
    }
    std::vector<RowDescription> after = before;
    after.at(10'000).value = false;
    after.erase(after.begin());

    EXPECT_EQ(text.changes(before, after), "- App 0\n"
                                           "~ App 10000                off\n");
}

} // namespace
} // namespace nimbra::cli
