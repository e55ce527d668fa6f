#include "host/core/RowLookup.h"

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

TEST(RowLookup, ASwitchWithASetterCanBeSet) {
    EXPECT_FALSE(refusalToSet(*settableSwitch()).has_value());
}

TEST(RowLookup, SaysWhyARowCannotBeSet) {
    const auto locked = settableSwitch();
    locked->setPropertyForKey(false, EnabledKey);

    EXPECT_EQ(refusalToSet(*locked)->reason, Reason::locked);
    EXPECT_EQ(refusalToSet(*row(nullptr, "a", ButtonCell))->reason, Reason::notASwitch);
    EXPECT_EQ(refusalToSet(*Specifier::groupSpecifierWithID("a"))->reason, Reason::notASwitch);
    EXPECT_EQ(refusalToSet(*row(nullptr, "a"))->reason, Reason::noSetter);
    EXPECT_EQ(refusalToSet(*row(nullptr, nullptr))->explanation,
              "the row without a name cannot be changed");
}

TEST(RowLookup, SaysWhyARowCannotBeTapped) {
    const auto button = row(nullptr, "a", ButtonCell);
    EXPECT_EQ(refusalToTap(*button)->reason, Reason::noAction);

    button->setButtonAction([](const std::shared_ptr<Specifier>&) {});
    EXPECT_FALSE(refusalToTap(*button).has_value());

    button->setPropertyForKey(false, EnabledKey);
    EXPECT_EQ(refusalToTap(*button)->reason, Reason::locked);
    EXPECT_EQ(refusalToTap(*row(nullptr, "a"))->reason, Reason::notAButton);
    EXPECT_EQ(refusalToTap(*row(nullptr, "a", LinkListCell))->reason, Reason::notAButton);
}

TEST(RowLookup, SaysWhyARowCannotBeRead) {
    const auto readable = Specifier::preferenceSpecifierNamed(
        "a", {.get = [](const Specifier&) { return RowValue(false); }, .cell = SwitchCell});

    EXPECT_FALSE(refusalToRead(*readable).has_value());
    EXPECT_EQ(refusalToRead(*row(nullptr, "a"))->reason, Reason::noValue);
}

} // namespace
} // namespace nimbra::host
