#include "platform/values/Text.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

TEST(Text, ACopyIsTheSameObject) {
    const Text text("words");
    const Text copy = text; // NOLINT(performance-unnecessary-copy-initialization): what is tested

    EXPECT_TRUE(copy.isSameObjectAs(text));
    EXPECT_EQ(copy, text);
}

TEST(Text, EqualWordsAreEqualButNotTheSameObject) {
    const Text first("words");
    const Text second("words");

    EXPECT_EQ(first, second);
    EXPECT_FALSE(first.isSameObjectAs(second));
}

TEST(Text, AnAbsentTextIsNotAnEmptyOne) {
    const Text absent;
    const Text empty("");

    EXPECT_FALSE(absent.isPresent());
    EXPECT_TRUE(empty.isPresent());
    EXPECT_NE(absent, empty);
    EXPECT_EQ(absent.string(), "");
}

TEST(Text, AbsentTextsAreEqualAndHaveNoIdentity) {
    const Text first;
    const Text second(nullptr);

    EXPECT_EQ(first, second);
    EXPECT_FALSE(first.isSameObjectAs(second));
}

} // namespace
} // namespace nimbra
