#include "host/core/RowDescription.h"

#include "platform/system/ClassRegistry.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace nimbra::host {
namespace {

TEST(RowDescription, TellsAllOfAGroup) {
    const auto group = Specifier::groupSpecifierWithID("Group");
    group->setPropertyForKey(Text("Footer"), FooterTextGroupKey);
    group->setPropertyForKey(Text("FooterView"), FooterCellClassGroupKey);

    EXPECT_EQ(RowDescription::of(*group).json().dump(),
              R"({"kind":"group","id":"Group","name":null,"enabled":true,"value":null,)"
              R"("footer":"Footer","footerClass":"FooterView","icon":null,"detail":null})");
}

TEST(RowDescription, TellsAllOfALink) {
    const ControllerClass detail{.name = "Detail", .create = {}};
    const auto link = Specifier::preferenceSpecifierNamed(
        "Link", {.get = [](const Specifier&) { return Text("3 apps"); },
                 .detail = &detail,
                 .cell = LinkListCell});
    link->setPropertyForKey(false, EnabledKey);

    EXPECT_EQ(RowDescription::of(*link).json().dump(),
              R"({"kind":"link","id":null,"name":"Link","enabled":false,"value":"3 apps",)"
              R"("footer":null,"footerClass":null,"icon":null,"detail":"Detail"})");
}

TEST(RowDescription, TellsOfASwitchWhetherItIsOn) {
    const auto row = Specifier::preferenceSpecifierNamed(
        "Switch", {.get = [](const Specifier&) { return RowValue(true); }, .cell = SwitchCell});

    const auto description = RowDescription::of(*row);

    EXPECT_EQ(kindName(description.kind), "switch");
    EXPECT_EQ(description.json()["value"], true);
    EXPECT_EQ(displayedValue(description.value), "on");
}

TEST(RowDescription, HasTheIconOfTheApplicationThatTheHostIsToFetch) {
    const auto row = Specifier::preferenceSpecifierNamed("Notes", {.cell = SwitchCell});
    row->setPropertyForKey(Text("com.example.notes"), LazyIconAppID);
    EXPECT_EQ(RowDescription::of(*row).icon, Text());

    row->setPropertyForKey(false, LazyIconLoading);
    EXPECT_EQ(RowDescription::of(*row).icon, Text());

    row->setPropertyForKey(true, LazyIconLoading);
    EXPECT_EQ(RowDescription::of(*row).icon, Text("com.example.notes"));
    EXPECT_EQ(RowDescription::of(*row).json()["icon"], "com.example.notes");
}

TEST(RowDescription, CallsARowByItsIdentifierOrElseItsName) {
    const auto row = Specifier::preferenceSpecifierNamed("Button", {.cell = ButtonCell});
    EXPECT_EQ(RowDescription::of(*row).label(), Text("Button"));

    row->setIdentifier("button");
    EXPECT_EQ(RowDescription::of(*row).label(), Text("button"));
    EXPECT_EQ(kindName(RowDescription::of(*row).kind), "button");
}

TEST(RowDescription, ShowsEveryKindOfValue) {
    EXPECT_EQ(displayedValue(RowValue()), "");
    EXPECT_EQ(displayedValue(RowValue(false)), "off");
    EXPECT_EQ(displayedValue(RowValue(std::int64_t{12})), "12");
    EXPECT_EQ(displayedValue(RowValue(Text("text"))), "text");
    EXPECT_EQ(jsonOf(RowValue(std::int64_t{12})).dump(), "12");
    EXPECT_EQ(jsonOf(RowValue(Text())).dump(), "null");
}

} // namespace
} // namespace nimbra::host
