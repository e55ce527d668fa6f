#include "device/system/LanguageChain.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using Languages = std::vector<std::string>;

TEST(LanguageChainTest, ARegionFallsBackToItsLanguage) {
    EXPECT_EQ(languageChain("de-AT"), (Languages{"de-AT", "de-Latn-AT", "de-Latn", "de"}));
    EXPECT_EQ(languageChain("de"), (Languages{"de", "de-Latn-DE", "de-DE", "de-Latn"}));
    EXPECT_EQ(languageChain("ar-EG").back(), "ar");
}

TEST(LanguageChainTest, AScriptNeverFallsBackToAnother) {
    EXPECT_EQ(languageChain("zh-TW"), (Languages{"zh-TW", "zh-Hant-TW", "zh-Hant"}));
    EXPECT_EQ(languageChain("zh-Hant-HK"), (Languages{"zh-Hant-HK", "zh-HK", "zh-Hant"}));
    EXPECT_EQ(languageChain("zh-CN"), (Languages{"zh-CN", "zh-Hans-CN", "zh-Hans", "zh"}));
    // Serbia writes Serbian in Cyrillic letters.
    EXPECT_EQ(languageChain("sr-Latn"), (Languages{"sr-Latn", "sr-Latn-RS"}));
    EXPECT_EQ(languageChain("sr"), (Languages{"sr", "sr-Cyrl-RS", "sr-RS", "sr-Cyrl"}));
}

TEST(LanguageChainTest, ExtensionsDoNotMatter) {
    EXPECT_EQ(languageChain("de-DE-u-co-phonebk"),
              (Languages{"de-DE-u-co-phonebk", "de-Latn-DE", "de-DE", "de-Latn", "de"}));
}

TEST(LanguageChainTest, ALanguageThatNobodyKnowsIsLookedForAsItIs) {
    EXPECT_EQ(languageChain("xx-YY").front(), "xx-YY");
    EXPECT_EQ(languageChain("xx-YY").back(), "xx");
}

TEST(LanguageChainTest, ATagIsOneFromItsBeginningToItsEnd) {
    for (const char* const tag : {"de", "de-DE", "zh-Hant-TW", "de-DE-u-co-phonebk"}) {
        EXPECT_TRUE(isLanguageTag(tag)) << tag;
    }
    for (const char* const other : {"", "de_DE", "de-", "german language", "de-DE-", "1"}) {
        EXPECT_FALSE(isLanguageTag(other)) << other;
    }
}

} // namespace
} // namespace nimbra::device
