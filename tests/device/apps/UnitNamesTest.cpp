#include "device/apps/UnitNames.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

TEST(UnitNames, EscapeWhatWouldPartThem) {
    EXPECT_EQ(escapedForUnitName("com.example.Notes_2:a"), "com.example.Notes_2:a");
    EXPECT_EQ(escapedForUnitName("a-b/c d@e\\"), "a\\x2db\\x2fc\\x20d\\x40e\\x5c");
    EXPECT_EQ(escapedForUnitName(".hidden.one"), "\\x2ehidden.one");
    EXPECT_EQ(escapedForUnitName("é*"), "\\xc3\\xa9\\x2a");
    EXPECT_EQ(escapedForUnitName(""), "");
}

TEST(UnitNames, AreTheApplicationsInEveryUsualForm) {
    for (const char* const unit :
         {"app-org.example.Notes-4711.scope", "app-gnome-org.example.Notes-4711.scope",
          "app-org.example.Notes.service", "app-org.example.Notes@4711.service",
          "app-gnome-org.example.Notes.service", "app-KDE-org.example.Notes@a-b.service",
          "app-org.example.Notes@autostart.service"}) {
        EXPECT_TRUE(isUnitOfApplication(unit, "org.example.Notes")) << unit;
    }
    EXPECT_TRUE(isUnitOfApplication("app-my\\x2dnotes-4711.scope", "my-notes"));
}

TEST(UnitNames, OfAnotherApplicationAreNotTaken) {
    for (const char* const unit :
         {"app-org.example.Notes2-4711.scope", "app-org.example-4711.scope",
          "app-org.example.Notes.scope", "app-a-org.example.Notes-b-4711.scope",
          "app-gnome-org.example.Clock-org.example.Notes.scope", "org.example.Notes-4711.scope",
          "app-org.example.Notes.slice", "app-a-b-org.example.Notes.service",
          "app-gnome-org.example.Clock@org.example.Notes.service", "app-.scope", "app-", ""}) {
        EXPECT_FALSE(isUnitOfApplication(unit, "org.example.Notes")) << unit;
    }
    EXPECT_FALSE(isUnitOfApplication("app-my-notes-4711.scope", "my-notes"));
}

TEST(UnitNames, OfALauncherAreNotThoseOfWhatItLaunched) {
    EXPECT_FALSE(isUnitOfApplication("app-gnome-org.example.Notes-4711.scope", "gnome"));
    EXPECT_FALSE(isUnitOfApplication("app-gnome-org.example.Notes.service", "gnome"));
}

} // namespace
} // namespace nimbra::device
