#include "device/files/ApplicationFileName.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

TEST(ApplicationFileNameTest, AnIdentifierNamesItsFile) {
    EXPECT_EQ(applicationFileName("org.example.Notes", ".desktop"), "org.example.Notes.desktop");
    EXPECT_EQ(applicationFileName("grüße + mehr", ".pid"), "grüße + mehr.pid");
}

TEST(ApplicationFileNameTest, NoIdentifierLeadsToAnotherFolder) {
    EXPECT_EQ(applicationFileName("../passwd", ".desktop"), "..%2Fpasswd.desktop");
    EXPECT_EQ(applicationFileName("/etc/passwd", ".pid"), "%2Fetc%2Fpasswd.pid");
    EXPECT_EQ(applicationFileName(std::string_view("a\0b\n", 4), ".pid"), "a%00b%0A.pid");
}

TEST(ApplicationFileNameTest, TwoIdentifiersNeverShareAFile) {
    EXPECT_NE(applicationFileName("a/b", ".pid"), applicationFileName("a%2Fb", ".pid"));
}

TEST(ApplicationFileNameTest, AFileTellsItsApplication) {
    for (const std::string_view identifier :
         {std::string_view("org.example.Notes"), std::string_view("../passwd"),
          std::string_view("a\0b\n", 4), std::string_view("gr\u00fc\u00dfe 100%")}) {
        EXPECT_EQ(applicationOfFileName(applicationFileName(identifier, ".pid"), ".pid"),
                  identifier);
    }
}

TEST(ApplicationFileNameTest, NamesThatNoApplicationHasTellNone) {
    for (const char* const name : {"a.desktop", "a%2.pid", "a%zz.pid", "a%61.pid", "%.pid"}) {
        EXPECT_EQ(applicationOfFileName(name, ".pid"), std::nullopt) << name;
    }
}

} // namespace
} // namespace nimbra::device
