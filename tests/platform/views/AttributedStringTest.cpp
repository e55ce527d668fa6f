#include "platform/views/AttributedString.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra {
namespace {

using Runs = std::vector<AttributedString::Run>;

const TextAttributes plain{};
const TextAttributes bold{.FontAttributeName = Font::boldSystemFontOfSize(17),
                          .ParagraphStyleAttributeName = {}};
const TextAttributes centred{.FontAttributeName = {},
                             .ParagraphStyleAttributeName = {.alignment = TextAlignment::center}};

TEST(AttributedStringTest, AStringIsOneRun) {
    const AttributedString text("text", bold);

    EXPECT_EQ(text.runs(), Runs({{"text", bold}}));
    EXPECT_EQ(text.string(), "text");
}

TEST(AttributedStringTest, NoTextIsNoRun) {
    EXPECT_TRUE(AttributedString().runs().empty());
    EXPECT_TRUE(AttributedString(Text(), bold).runs().empty());
    EXPECT_TRUE(AttributedString("", bold).runs().empty());
    EXPECT_EQ(AttributedString(Text(), bold).string(), "");
}

TEST(AttributedStringTest, WhatIsAppendedKeepsItsAttributes) {
    MutableAttributedString text("one ", plain);

    text.appendAttributedString(AttributedString("two ", bold));
    text.appendAttributedString(AttributedString("three", centred));

    EXPECT_EQ(text.runs(), Runs({{"one ", plain}, {"two ", bold}, {"three", centred}}));
    EXPECT_EQ(text.string(), "one two three");
}

TEST(AttributedStringTest, WhatIsSetAlikeBecomesOneRun) {
    MutableAttributedString text("one ", plain);
    MutableAttributedString more("two ", plain);
    more.appendAttributedString(AttributedString("three", bold));

    text.appendAttributedString(more);
    text.appendAttributedString(AttributedString(" four", bold));

    EXPECT_EQ(text.runs(), Runs({{"one two ", plain}, {"three four", bold}}));
}

TEST(AttributedStringTest, AnEmptyTextAddsNothing) {
    MutableAttributedString text("one", plain);

    text.appendAttributedString(AttributedString());
    text.appendAttributedString(AttributedString("", bold));
    text.appendAttributedString(AttributedString(" two", plain));

    EXPECT_EQ(text.runs(), Runs({{"one two", plain}}));
}

TEST(AttributedStringTest, ATextMayBeAppendedToAnEmptyOne) {
    MutableAttributedString text;

    text.appendAttributedString(AttributedString("one", bold));

    EXPECT_EQ(text.runs(), Runs({{"one", bold}}));
}

TEST(AttributedStringTest, ATextMayBeAppendedToItself) {
    MutableAttributedString text("a", plain);
    text.appendAttributedString(AttributedString("b", bold));
    MutableAttributedString uniform("a", plain);

    text.appendAttributedString(text);
    uniform.appendAttributedString(uniform);

    EXPECT_EQ(text.runs(), Runs({{"a", plain}, {"b", bold}, {"a", plain}, {"b", bold}}));
    EXPECT_EQ(uniform.runs(), Runs({{"aa", plain}}));
}

TEST(AttributedStringTest, EqualTextsHaveEqualRuns) {
    MutableAttributedString inParts("te", bold);
    inParts.appendAttributedString(AttributedString("xt", bold));
    const AttributedString atOnce("text", bold);

    EXPECT_EQ(inParts, atOnce);
    EXPECT_NE(atOnce, AttributedString("text", plain));
    EXPECT_NE(atOnce, AttributedString("Text", bold));
    EXPECT_NE(AttributedString("text", centred), AttributedString("text", plain));
    EXPECT_EQ(AttributedString("", bold), AttributedString());
}

TEST(AttributedStringTest, ACopyDoesNotGrowWithItsOrigin) {
    MutableAttributedString text("one", plain);
    const AttributedString copy = text;

    text.appendAttributedString(AttributedString(" two", plain));

    EXPECT_EQ(copy.string(), "one");
}

} // namespace
} // namespace nimbra
