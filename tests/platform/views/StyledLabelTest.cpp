#include "platform/views/Label.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <limits>
#include <memory>
#include <optional>
#include <string>

namespace nimbra {
namespace {

/// Under a root view, both of them laid out.
struct StyledLabelTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<View> root = std::make_shared<View>(platform.services(), Rect{});
    std::shared_ptr<Label> label = std::make_shared<Label>(platform.services(), Rect{});
    const AttributedString styled{
        "twelve bytes",
        {.FontAttributeName = Font::boldSystemFontOfSize(24), .ParagraphStyleAttributeName = {}}};

    void SetUp() override {
        root->addSubview(label);
        root->layoutIfNeeded();
    }
    void expectALayoutIsAskedFor() {
        EXPECT_TRUE(root->needsLayout());
        EXPECT_TRUE(label->needsLayout());
        root->layoutIfNeeded();
    }
    void expectNoLayoutIsAskedFor() const {
        EXPECT_FALSE(root->needsLayout());
        EXPECT_FALSE(label->needsLayout());
    }
};

TEST_F(StyledLabelTest, ALabelBeginsWithoutAStyledText) {
    label->setText("text");

    EXPECT_EQ(label->attributedText(), std::nullopt);
}

TEST_F(StyledLabelTest, TheLettersOfAStyledTextAreTheLabelsText) {
    label->setAttributedText(styled);

    EXPECT_EQ(label->text(), Text("twelve bytes"));
    EXPECT_EQ(label->attributedText(), styled);
}

TEST_F(StyledLabelTest, AnEmptyStyledTextIsAnEmptyText) {
    label->setAttributedText(AttributedString());

    EXPECT_EQ(label->text(), Text(""));
    EXPECT_EQ(label->attributedText(), AttributedString());
    EXPECT_EQ(label->intrinsicContentSize(), Size{});
}

TEST_F(StyledLabelTest, APlainTextDropsTheStyle) {
    label->setAttributedText(styled);

    label->setText("twelve bytes");

    EXPECT_EQ(label->attributedText(), std::nullopt);
    EXPECT_EQ(label->intrinsicContentSize().height, 14.4 * (17 / 12.0));
}

TEST_F(StyledLabelTest, NoStyledTextIsNoTextAtAll) {
    label->setAttributedText(styled);
    label->setAttributedText(std::nullopt);
    EXPECT_EQ(label->text(), Text());
    EXPECT_EQ(label->attributedText(), std::nullopt);

    label->setText("plain");
    label->setAttributedText(std::nullopt);

    EXPECT_EQ(label->text(), Text());
    EXPECT_EQ(label->intrinsicContentSize(), Size{});
}

TEST_F(StyledLabelTest, AStyledTextIsMeasuredInItsOwnAttributes) {
    label->setFont({12});
    label->setNumberOfLines(0);
    label->setAttributedText(styled);

    EXPECT_EQ(label->heightForWidth(36), 2 * 28.8);
    EXPECT_EQ(label->intrinsicContentSize(), (Size{72, 28.8}));
    ASSERT_EQ(platform.viewMetrics.measured.size(), 2U);
    EXPECT_EQ(platform.viewMetrics.measured[0].text, styled);
    EXPECT_EQ(platform.viewMetrics.measured[0].width, 36);
    EXPECT_EQ(platform.viewMetrics.measured[1].text, styled);
    EXPECT_EQ(platform.viewMetrics.measured[1].width, std::numeric_limits<double>::infinity());
}

TEST_F(StyledLabelTest, APlainTextIsMeasuredInTheLabelsFontAndADefaultParagraph) {
    label->setText("text");
    label->setFont({30});

    static_cast<void>(label->heightForWidth(36));

    EXPECT_EQ(platform.viewMetrics.measured.at(0).text,
              AttributedString("text", {.FontAttributeName = {.pointSize = 30},
                                        .ParagraphStyleAttributeName = {}}));
}

TEST_F(StyledLabelTest, AnotherStyledTextAsksForALayout) {
    label->setAttributedText(styled);
    expectALayoutIsAskedFor();
    label->setAttributedText(AttributedString("twelve bytes", {}));
    expectALayoutIsAskedFor();
    label->setText("twelve bytes");
    expectALayoutIsAskedFor();
    label->setAttributedText(AttributedString("twelve bytes", {}));
    expectALayoutIsAskedFor();
    label->setAttributedText(std::nullopt);
    expectALayoutIsAskedFor();
}

TEST_F(StyledLabelTest, TheSameStyledTextAsksForNothing) {
    label->setAttributedText(std::nullopt);
    expectNoLayoutIsAskedFor();
    label->setAttributedText(styled);
    root->layoutIfNeeded();

    label->setAttributedText(styled);

    expectNoLayoutIsAskedFor();
}

TEST_F(StyledLabelTest, ALabelWithoutASuperviewAsksForItself) {
    label->removeFromSuperview();
    root->layoutIfNeeded();
    label->layoutIfNeeded();

    label->setAttributedText(styled);

    EXPECT_TRUE(label->needsLayout());
    EXPECT_FALSE(root->needsLayout());
}

} // namespace
} // namespace nimbra
