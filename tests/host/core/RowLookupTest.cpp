#include "host/core/RowLookup.h"

#include "platform/system/ClassRegistry.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::host {
namespace {

using Reason = RowRefusal::Reason;

std::shared_ptr<Specifier> row(Text identifier, Text name, CellType cell = SwitchCell) {
    const auto specifier = Specifier::preferenceSpecifierNamed(std::move(name), {.cell = cell});
    specifier->setIdentifier(std::move(identifier));
    return specifier;
}

std::shared_ptr<Specifier> settableSwitch() {
    return Specifier::preferenceSpecifierNamed(
        "Switch",
        {.set = [](const RowValue&, const std::shared_ptr<Specifier>&) {}, .cell = SwitchCell});
}

TEST(RowLookup, FindsARowByItsIdentifierBeforeOneByItsName) {
    const SpecifierArray rows{row(nullptr, "notes"), row("notes", "Notes")};

    EXPECT_EQ(findRow(rows, "notes").value(), rows[1]);
    EXPECT_EQ(findRow(rows, "Notes").value(), rows[1]);
}

TEST(RowLookup, ListsTheRowsThereAreWhenThereIsNoneOfThatName) {
    const SpecifierArray rows{Specifier::groupSpecifierWithID("Group"), row(nullptr, "One"),
                              row("two", "Two"), row("three", nullptr), row(nullptr, nullptr)};

    const auto found = findRow(rows, "Four");

    ASSERT_FALSE(found);
    EXPECT_EQ(found.error().reason, Reason::noSuchRow);
    EXPECT_EQ(found.error().explanation, R"(no row "Four" (rows: "One", "Two", "three"))");
    EXPECT_EQ(findRow({}, "Four").error().explanation, R"(no row "Four" (the list has no rows))");
}

TEST(RowLookup, ListsTheRowsThatAreLikeTheTextWhereThereAreMany) {
    SpecifierArray rows;
    for (int number = 1; number <= 20; ++number) {
        rows.push_back(row("app." + std::to_string(number), "App " + std::to_string(number)));
    }
    rows.push_back(row("com.example.notes", "Notes"));
    rows.push_back(row("org.example.notes", "Notes"));
    rows.push_back(row(nullptr, "My NOTEBOOK"));
    rows.push_back(row("footnote", nullptr));
    rows.push_back(row("heading.note", "Heading", GroupCell));

    EXPECT_EQ(findRow(rows, "Note").error().explanation,
              R"(no row "Note" (rows like it: "Notes", "My NOTEBOOK", "footnote"))");
    EXPECT_EQ(findRow(rows, "EXAMPLE").error().explanation,
              R"(no row "EXAMPLE" (rows like it: "Notes"))");
    EXPECT_EQ(findRow(rows, "app").error().explanation,
              R"(no row "app" (rows like it: "App 1", "App 2", "App 3", "App 4", "App 5", )"
              R"("App 6", "App 7", "App 8" and 12 more))");
}

TEST(RowLookup, ListsTheFirstRowsWhereThereAreManyAndNoneIsLikeTheText) {
    SpecifierArray rows;
    for (int number = 1; number <= 10'000; ++number) {
        rows.push_back(row(nullptr, "App " + std::to_string(number)));
    }
    const std::string first = R"((rows: "App 1", "App 2", "App 3", "App 4", "App 5", "App 6", )"
                              R"("App 7", "App 8" and 9992 more))";

    EXPECT_EQ(findRow(rows, "Notes").error().explanation, R"(no row "Notes" )" + first);
    EXPECT_EQ(findRow(rows, "p").error().explanation, R"(no row "p" )" + first);
}

TEST(RowLookup, NeverTakesAnAbsentNameForAnEmptyOne) {
    EXPECT_FALSE(findRow({row(nullptr, nullptr)}, ""));
}

TEST(RowLookup, NamesTheIdentifiersOfRowsThatHaveTheSameName) {
    const auto found = findRow({row("a", "Twin"), row("b", "Twin")}, "Twin");

    ASSERT_FALSE(found);
    EXPECT_EQ(found.error().reason, Reason::ambiguous);
    EXPECT_EQ(found.error().explanation,
              R"("Twin" stands for 2 rows (name one by its identifier: "a", "b"))");
    EXPECT_EQ(findRow({row(nullptr, "Twin"), row(nullptr, "Twin")}, "Twin").error().explanation,
              R"("Twin" stands for 2 rows, and none has an identifier)");
}

TEST(RowLookup, ASwitchWithASetterIsSet) {
    std::vector<RowValue> set;
    const auto settable = Specifier::preferenceSpecifierNamed(
        "Atlas", {.set = [&set](const RowValue& value, const auto&) { set.push_back(value); },
                  .cell = SwitchCell});

    EXPECT_TRUE(turnSwitch(*settable, true).has_value());
    settable->setPropertyForKey(false, EnabledKey);
    EXPECT_FALSE(turnSwitch(*settable, false).has_value());

    EXPECT_EQ(set, std::vector<RowValue>{true}) << "what is refused is not done";
}

TEST(RowLookup, SaysWhyARowCannotBeSet) {
    const auto locked = settableSwitch();
    locked->setPropertyForKey(false, EnabledKey);

    EXPECT_EQ(turnSwitch(*locked, true).error().reason, Reason::locked);
    EXPECT_EQ(turnSwitch(*row(nullptr, "a", ButtonCell), true).error().reason, Reason::notASwitch);
    EXPECT_EQ(turnSwitch(*Specifier::groupSpecifierWithID("a"), true).error().reason,
              Reason::notASwitch);
    EXPECT_EQ(turnSwitch(*row(nullptr, "a"), true).error().reason, Reason::noSetter);
    EXPECT_EQ(turnSwitch(*row(nullptr, nullptr), true).error().explanation,
              "the row without a name cannot be changed");
}

TEST(RowLookup, SaysWhyARowCannotBeTapped) {
    const auto button = row(nullptr, "a", ButtonCell);
    EXPECT_EQ(refusalToTap(*button)->reason, Reason::noAction);

    int presses = 0;
    button->setButtonAction([&presses](const std::shared_ptr<Specifier>&) { ++presses; });
    EXPECT_FALSE(refusalToTap(*button).has_value());
    EXPECT_TRUE(pressButton(*button).has_value());
    EXPECT_EQ(presses, 1);

    button->setPropertyForKey(false, EnabledKey);
    EXPECT_EQ(refusalToTap(*button)->reason, Reason::locked);
    EXPECT_EQ(pressButton(*button).error().reason, Reason::locked);
    EXPECT_EQ(presses, 1) << "what is refused is not done";
    EXPECT_EQ(refusalToTap(*row(nullptr, "a"))->reason, Reason::notAButton);
    EXPECT_EQ(pressButton(*row(nullptr, "a", LinkListCell)).error().reason, Reason::notAButton)
        << "a link can be tapped, which opens its page";
}

TEST(RowLookup, ALinkCanBeTappedUnlessItIsLocked) {
    const auto link = row(nullptr, "a", LinkListCell);
    EXPECT_FALSE(refusalToTap(*link).has_value());

    link->setPropertyForKey(false, EnabledKey);
    EXPECT_EQ(refusalToTap(*link)->reason, Reason::locked);
}

TEST(RowLookup, SaysWhichLinkOpensNoPage) {
    const auto linkTo = [](const ControllerClass* pageClass) {
        return Specifier::preferenceSpecifierNamed("a",
                                                   {.detail = pageClass, .cell = LinkListCell});
    };
    const ControllerClass page{.name = "Page",
                               .create = [](const auto& /*services*/) { return nullptr; },
                               .classOperations = {}};
    const ControllerClass withoutPages{.name = "Class", .create = nullptr, .classOperations = {}};

    EXPECT_FALSE(refusalToOpen(*linkTo(&page)).has_value());
    EXPECT_EQ(refusalToOpen(*linkTo(nullptr))->reason, Reason::noPage);
    EXPECT_EQ(refusalToOpen(*linkTo(&withoutPages))->reason, Reason::noPage);
    EXPECT_FALSE(refusalToOpen(*row(nullptr, "a", ButtonCell)).has_value());
}

TEST(RowLookup, SaysWhyARowCannotBeRead) {
    const auto readable = Specifier::preferenceSpecifierNamed(
        "a", {.get = [](const Specifier&) { return RowValue(false); }, .cell = SwitchCell});

    EXPECT_FALSE(refusalToRead(*readable).has_value());
    EXPECT_EQ(refusalToRead(*row(nullptr, "a"))->reason, Reason::noValue);
}

} // namespace
} // namespace nimbra::host
