#include "platform/host/Specifier.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

TEST(Specifier, AGroupHasAnIdentifierAndNoName) {
    const auto group = Specifier::groupSpecifierWithID("Group");

    EXPECT_EQ(group->identifier(), Text("Group"));
    EXPECT_FALSE(group->name());
    EXPECT_EQ(group->cellType(), GroupCell);
    EXPECT_EQ(group->label(), Text("Group"));
}

TEST(Specifier, ARowGoesByItsNameUntilItHasAnIdentifier) {
    const auto row = Specifier::preferenceSpecifierNamed("Row", {.cell = ButtonCell});
    EXPECT_EQ(row->label(), Text("Row"));

    row->setIdentifier("row.identifier");

    EXPECT_EQ(row->label(), Text("row.identifier"));
    EXPECT_EQ(row->name(), Text("Row"));
}

TEST(Specifier, CellTypesHaveTheHostsNumbers) {
    EXPECT_EQ(static_cast<int>(LinkListCell), 2);
    EXPECT_EQ(static_cast<int>(SwitchCell), 6);
    EXPECT_EQ(static_cast<int>(ButtonCell), 13);
}

TEST(Specifier, TheGetterAndTheSetterAreAskedWithTheRow) {
    const Specifier* asked = nullptr;
    RowValue kept = true;
    const auto row = Specifier::preferenceSpecifierNamed(
        "Row", {.set = [&kept](const RowValue& value, const auto&) { kept = value; },
                .get =
                    [&](const Specifier& from) {
                        asked = &from;
                        return kept;
                    },
                .cell = SwitchCell});

    EXPECT_EQ(row->value(), RowValue(true));
    EXPECT_EQ(asked, row.get());
    row->setValue(false);

    EXPECT_EQ(row->value(), RowValue(false));
}

TEST(Specifier, ARowWithoutGetterSetterAndActionDoesNothing) {
    const auto row = Specifier::preferenceSpecifierNamed("Row", {.cell = ButtonCell});

    row->setValue(true);
    row->performButtonAction();

    EXPECT_EQ(row->value(), RowValue());
    EXPECT_FALSE(row->hasSetter());
    EXPECT_FALSE(row->hasButtonAction());
}

TEST(Specifier, AnActionIsPerformedWithTheRow) {
    const auto row = Specifier::preferenceSpecifierNamed("Row", {.cell = ButtonCell});
    std::shared_ptr<Specifier> tapped;
    row->setButtonAction([&tapped](const auto& from) { tapped = from; });

    row->performButtonAction();

    EXPECT_EQ(tapped, row);
}

TEST(Specifier, OnlyAFalseEnabledPropertyLocksARow) {
    const auto row = Specifier::preferenceSpecifierNamed("Row", {.cell = SwitchCell});
    EXPECT_TRUE(row->isEnabled());

    row->setPropertyForKey(false, EnabledKey);
    EXPECT_FALSE(row->isEnabled());

    row->setPropertyForKey(true, EnabledKey);
    EXPECT_TRUE(row->isEnabled());
}

TEST(UserInfo, AValueOfAnotherTypeCountsAsAbsent) {
    const UserInfo userInfo{{FirstSetupKey, Text("yes")}};

    EXPECT_FALSE(userInfoValue<bool>(userInfo, FirstSetupKey));
    EXPECT_FALSE(userInfoValue<Text>(userInfo, AccountIdentifierKey));
    EXPECT_EQ(userInfoValue<Text>(userInfo, FirstSetupKey), Text("yes"));
}

TEST(UserInfo, TheKeysOfAnEntryRowAreTheHosts) {
    EXPECT_EQ(FirstSetupKey, UserInfoKey("firstSetup"));
    EXPECT_EQ(AccountKey, UserInfoKey("AccountKey"));
    EXPECT_EQ(AccountIdentifierKey, UserInfoKey("AccountIdentifierKey"));
}

} // namespace
} // namespace nimbra
