#include "device/apps/DesktopLocales.h"

#include "device/system/LanguageChain.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using Names = std::vector<std::string>;

Names namesFor(const char* locale) {
    return desktopLocaleNames(languageChain(locale));
}

TEST(DesktopLocalesTest, ARegionFallsBackToItsLanguage) {
    EXPECT_EQ(namesFor("de-AT"), (Names{"de_AT", "de"}));
    EXPECT_EQ(namesFor("de"), (Names{"de", "de_DE"}));
    EXPECT_EQ(namesFor("de-DE-u-co-phonebk"), (Names{"de_DE", "de"}));
}

TEST(DesktopLocalesTest, AScriptThatIsNotTheUsualOneIsAModifier) {
    EXPECT_EQ(namesFor("sr-Latn"), (Names{"sr@latin", "sr_RS@latin"}));
    EXPECT_EQ(namesFor("sr-Latn-RS"), (Names{"sr_RS@latin", "sr@latin"}));
    EXPECT_EQ(namesFor("sr-RS"), (Names{"sr_RS", "sr"}));
    EXPECT_EQ(namesFor("uz-Cyrl-UZ"), (Names{"uz_UZ@cyrillic", "uz@cyrillic"}));
}

TEST(DesktopLocalesTest, AScriptWithoutAModifierIsToldByTheRegion) {
    EXPECT_EQ(namesFor("zh-Hant-HK"), (Names{"zh_HK", "zh_TW"}));
    EXPECT_EQ(namesFor("zh-TW"), (Names{"zh_TW"}));
    EXPECT_EQ(namesFor("zh-Hant-CN"), (Names{"zh_TW"}));
    EXPECT_EQ(namesFor("zh-SG"), (Names{"zh_SG", "zh_CN", "zh"}));
}

TEST(DesktopLocalesTest, WhatIsNoLanguageHasNoName) {
    EXPECT_EQ(namesFor("xx-YY"), (Names{"xx_YY", "xx"}));
    EXPECT_EQ(desktopLocaleNames({"not a tag"}), Names{});
}

} // namespace
} // namespace nimbra::device
