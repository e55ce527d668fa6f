#include "tools/mrctl/Pseudonyms.h"

#include <gtest/gtest.h>
#include <random>
#include <set>
#include <string>
#include <vector>

namespace nimbra::mrctl {
namespace {

constexpr auto root = "/srv/phone";

/// A text of `size` characters out of `characters`.
std::string randomText(std::mt19937& random, std::size_t size,
                       const std::vector<std::string>& characters) {
    std::string text;
    for (std::size_t count = 0; count < size; ++count) {
        text += characters[random() % characters.size()];
    }
    return text;
}

const std::vector<std::string> anyCharacters{"a", "b", "Q", "7",      "-",  " ",  "'",
                                             "/", "_", ".", "\u00e9", "日", "\"", "\u2019"};

TEST(PseudonymsTest, AValueHasOnePseudonymEverywhere) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "Ann's Phone");
    pseudonyms.learn(SecretKind::account, "Ann's Phone");

    EXPECT_EQ(pseudonyms.of(SecretKind::device, "Ann's Phone"), "device-1");
    EXPECT_EQ(pseudonyms.of(SecretKind::account, "Ann's Phone"), "device-1");
    EXPECT_EQ(pseudonyms.replaced("on Ann's Phone, not Ann's Phone"), "on device-1, not device-1");
}

TEST(PseudonymsTest, AValueIsFoundInItsOtherSpellings) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "Jos\u00e9's \"Pad\"\n");

    // Signs at its end tell nothing.
    EXPECT_EQ(pseudonyms.replaced("Jos\u00e9's \"Pad\" "), "device-1\" ");
    EXPECT_EQ(pseudonyms.replaced("Jos\\u00E9's \\\"Pad"), "device-1");
    EXPECT_EQ(pseudonyms.replaced("n=Jos%c3%a9%27s%20%22Pad"), "n=device-1");
    EXPECT_EQ(pseudonyms.replaced("n=Jos%25C3%25A9's+Pad"), "n=device-1");
    EXPECT_EQ(pseudonyms.replaced("JOSE\u0301'S  PAD"), "device-1");
    EXPECT_EQ(pseudonyms.replaced("joses-pad, JosesPad, Jos\u00e9s\u00a0Pad"),
              "device-1, device-1, device-1");
    EXPECT_EQ(pseudonyms.replaced("Jos \x1b[1m\u00e9s P\x1b[0mad"), "device-1");
}

TEST(PseudonymsTest, TheNameInTheArchivesNameIsFound) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "Lab\u2019s Pad / 2");

    EXPECT_EQ(pseudonyms.replaced("to Lab's_Pad_:_2-x"), "to device-1-x");
}

TEST(PseudonymsTest, ShortValuesAreReplacedInTheirOwnFieldsOnly) {
    for (const std::string name : {"a", "\u00e9", "42", "12345", "Phone", "error"}) {
        Pseudonyms pseudonyms(root);
        pseudonyms.learn(SecretKind::device, name);

        const std::string text = "error: a phone caf\u00e9 42 12345 Phone";
        EXPECT_EQ(pseudonyms.replaced(text), text);
        EXPECT_EQ(pseudonyms.of(SecretKind::device, name), "device-1");
    }
}

TEST(PseudonymsTest, ValuesOfAFewLettersAreReplacedAsWholeWords) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "Ann");

    EXPECT_EQ(pseudonyms.replaced("Annex, Ann, (Ann), Ann\u2019s, Ann_1, \u00fcAnn"),
              "Annex, device-1, (device-1), device-1\u2019s, device-1_1, \u00fcdevice-1");
}

TEST(PseudonymsTest, LongerValuesAreReplacedInsideWords) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::container, "com.example.x");
    pseudonyms.learn(SecretKind::user, "花子");

    EXPECT_EQ(pseudonyms.replaced("1com.example.x2 私花子です"), "1container-12 私user-1です");
}

TEST(PseudonymsTest, TheLongestOfSeveralValuesCounts) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::user, "Ann Lee");
    pseudonyms.learn(SecretKind::device, "Ann Lee's Pad");

    EXPECT_EQ(pseudonyms.replaced("Ann Lee's Pad of Ann Lee"), "device-1 of user-1");
}

TEST(PseudonymsTest, NothingIsLeftOfValuesThatOverlap) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "north wing desk");
    pseudonyms.learn(SecretKind::account, "desk of Ann");

    EXPECT_EQ(pseudonyms.replaced("x north wing desk of Ann y"), "x device-1 y");
}

TEST(PseudonymsTest, NoPseudonymIsAValue) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "device-1");
    pseudonyms.learn(SecretKind::device, "device-2");
    pseudonyms.learn(SecretKind::device, "vice-3");
    pseudonyms.learn(SecretKind::account, "device-");

    EXPECT_EQ(pseudonyms.of(SecretKind::device, "device-1"), "device-3");
    EXPECT_EQ(pseudonyms.of(SecretKind::device, "device-2"), "device-4");
    EXPECT_EQ(pseudonyms.replaced("device-1 and device-2"), "device-3 and device-4");
}

TEST(PseudonymsTest, WhatLooksLikeASecretOnceIsOneEverywhere) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learnFrom("password=hunter22, for ann.lee@example.com");
    const std::string file = "/home" + std::string("/annlee/Tax.pdf");
    pseudonyms.learnFrom("cannot read " + file);

    EXPECT_EQ(pseudonyms.replaced("xhunter22y"), "xsecret-1y");
    EXPECT_EQ(pseudonyms.replaced("annlee has Tax.pdf"), "user-1 has file-1");
    EXPECT_EQ(pseudonyms.replaced("see " + file), "see path-1");
}

TEST(PseudonymsTest, WhileLearningNothingIsReplaced) {
    Pseudonyms pseudonyms(root);
    pseudonyms.setLearning(true);
    EXPECT_EQ(pseudonyms.replaced("password=hunter22"), "password=hunter22");
    EXPECT_EQ(pseudonyms.of(SecretKind::device, "Ann's Pad"), "Ann's Pad");
    EXPECT_TRUE(pseudonyms.counts().empty());

    pseudonyms.setLearning(false);
    EXPECT_EQ(pseudonyms.replaced("hunter22 on Ann's Pad"), "secret-1 on device-1");
}

TEST(PseudonymsTest, ValuesOfOwnFieldsAreNotSearchedFor) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::container, "com.example.notes", Pseudonyms::Search::ownFields);

    EXPECT_EQ(pseudonyms.replaced("com.example.notes"), "com.example.notes");
    EXPECT_EQ(pseudonyms.of(SecretKind::container, "com.example.notes"), "container-1");
}

TEST(PseudonymsTest, EmptyValuesAreNone) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "");

    EXPECT_EQ(pseudonyms.of(SecretKind::device, ""), "");
    EXPECT_TRUE(pseudonyms.counts().empty());
}

TEST(PseudonymsTest, WhatWasReplacedIsCounted) {
    Pseudonyms pseudonyms(root);
    pseudonyms.learn(SecretKind::device, "Ann's Phone");
    pseudonyms.learn(SecretKind::device, "never used");
    static_cast<void>(pseudonyms.replaced("Ann's Phone, Ann's Phone"));
    static_cast<void>(pseudonyms.of(SecretKind::device, "b"));

    const auto counts = pseudonyms.counts();
    ASSERT_EQ(counts.size(), 1U);
    EXPECT_EQ(counts.at(SecretKind::device).values, 2U);
    EXPECT_EQ(counts.at(SecretKind::device).places, 3U);
}

/// Many rounds of random values in random texts.
TEST(PseudonymsTest, NoLearnedValueIsLeftInAnyText) {
    std::mt19937 random(7); // NOLINT(cert-msc51-cpp): the same rounds each time
    for (int round = 0; round < 300; ++round) {
        Pseudonyms pseudonyms(root);
        std::vector<std::string> values;
        for (int count = 0; count < 20; ++count) {
            values.push_back(randomText(random, 8 + (random() % 12), anyCharacters));
            pseudonyms.learn(static_cast<SecretKind>(random() % kSecretKindNames.size()),
                             values.back());
        }
        std::string text;
        for (int count = 0; count < 60; ++count) {
            text += randomText(random, random() % 4, anyCharacters);
            text += values[random() % values.size()];
        }
        pseudonyms.learnFrom(text);
        const std::string replaced = pseudonyms.replaced(text);
        std::set<std::string> names;
        for (const std::string& value : values) {
            EXPECT_EQ(replaced.find(value), std::string::npos) << value << " in " << replaced;
            const std::string name = pseudonyms.of(SecretKind::secret, value);
            EXPECT_EQ(name, pseudonyms.of(SecretKind::device, value));
            EXPECT_EQ(pseudonyms.replaced(value), name) << value;
            names.insert(name);
        }
        EXPECT_EQ(names.size(), std::set(values.begin(), values.end()).size());
    }
}

} // namespace
} // namespace nimbra::mrctl
