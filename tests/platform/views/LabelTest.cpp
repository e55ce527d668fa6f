#include "platform/views/Label.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

struct LabelTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<View> root = std::make_shared<View>(platform.services(), Rect{});
    std::shared_ptr<Label> label = std::make_shared<Label>(platform.services(), Rect{});

    void SetUp() override {
        root->addSubview(label);
        root->layoutIfNeeded();
    }
    void expectALayoutIsAskedFor() {
        EXPECT_TRUE(root->needsLayout());
        EXPECT_TRUE(label->needsLayout());
        root->layoutIfNeeded();
    }
};

TEST_F(LabelTest, ANewLabelIsEmptyBlackAndOnOneLineOfTheBodyFont) {
    EXPECT_FALSE(label->text());
    EXPECT_EQ(label->font(), Font{17});
    EXPECT_EQ(label->textColor(), Color::black);
    EXPECT_EQ(label->textAlignment(), TextAlignment::left);
    EXPECT_EQ(label->numberOfLines(), 1);
    EXPECT_EQ(label->intrinsicContentSize(), Size{});
}

TEST_F(LabelTest, WhatIsSetIsKept) {
    const Text text("text");

    label->setText(text);
    label->setTextColor(Color::gray);
    label->setTextAlignment(TextAlignment::center);
    label->setNumberOfLines(-3);

    EXPECT_TRUE(label->text().isSameObjectAs(text));
    EXPECT_EQ(label->textColor(), Color::gray);
    EXPECT_EQ(label->textAlignment(), TextAlignment::center);
    EXPECT_EQ(label->numberOfLines(), 0);
}

TEST_F(LabelTest, AnotherContentAsksForALayout) {
    label->setText("text");
    expectALayoutIsAskedFor();
    label->setFont({12});
    expectALayoutIsAskedFor();
    label->setNumberOfLines(0);
    expectALayoutIsAskedFor();
    label->setText(nullptr);
    expectALayoutIsAskedFor();
}

TEST_F(LabelTest, TheSameContentAsksForNothing) {
    label->setText("text");
    root->layoutIfNeeded();

    label->setText(std::string("text"));
    label->setFont({17});
    label->setNumberOfLines(1);

    EXPECT_FALSE(root->needsLayout());
    EXPECT_FALSE(label->needsLayout());
}

TEST_F(LabelTest, TheTextIsMeasuredInTheLabelsFont) {
    label->setFont(platform.viewMetrics.preferredFontForTextStyle(FontTextStyleCaption1));
    label->setText("twelve bytes");

    EXPECT_EQ(label->lineHeight(), 14.4);
    EXPECT_EQ(label->intrinsicContentSize(), (Size{72, 14.4}));
    EXPECT_EQ(label->heightForWidth(36), 14.4);
    label->setNumberOfLines(0);
    EXPECT_EQ(label->heightForWidth(36), 28.8);
    EXPECT_EQ(label->intrinsicContentSize(), (Size{72, 14.4}));
}

} // namespace
} // namespace nimbra
