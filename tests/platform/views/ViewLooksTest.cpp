#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "platform/views/View.h"
#include "tests/support/TestPlatform.h"

#include <cmath>
#include <gtest/gtest.h>
#include <memory>
#include <optional>

namespace nimbra {
namespace {

struct ViewLooksTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<View> view = std::make_shared<View>(platform.services(), Rect{});

    [[nodiscard]] double alphaAfter(double alpha) const {
        view->setAlpha(alpha);
        return view->alpha();
    }
};

TEST_F(ViewLooksTest, ANewViewIsSeenAndTouchedAndLetsWhatIsBehindShineThrough) {
    EXPECT_EQ(view->alpha(), 1);
    EXPECT_FALSE(view->isHidden());
    EXPECT_EQ(view->backgroundColor(), std::nullopt);
    EXPECT_TRUE(view->isUserInteractionEnabled());
    EXPECT_EQ(view->accessibilityIdentifier(), "");
}

TEST_F(ViewLooksTest, WhatIsSetIsKept) {
    view->setBackgroundColor(Color::white);
    view->setUserInteractionEnabled(false);
    view->setAccessibilityIdentifier("_contentView");

    EXPECT_EQ(view->backgroundColor(), Color::white);
    EXPECT_FALSE(view->isUserInteractionEnabled());
    EXPECT_EQ(view->accessibilityIdentifier(), "_contentView");
}

TEST_F(ViewLooksTest, LooksAskForNoLayout) {
    view->layoutIfNeeded();

    view->setAlpha(0.5);
    view->setBackgroundColor(Color::white);
    view->setUserInteractionEnabled(false);

    EXPECT_FALSE(view->needsLayout());
}

TEST_F(ViewLooksTest, TheOpacityStaysBetweenNothingAndAll) {
    EXPECT_EQ(alphaAfter(0.25), 0.25);
    EXPECT_EQ(alphaAfter(-1), 0);
    EXPECT_EQ(alphaAfter(INFINITY), 1);
    EXPECT_EQ(alphaAfter(NAN), 0);
}

TEST_F(ViewLooksTest, SizedToFitALabelIsAsLargeAsItsTextWhereItStands) {
    const auto label = std::make_shared<Label>(platform.services(), Rect{{10, 20}, {1, 2}});
    label->setFont({12});
    label->setText("twelve bytes");
    label->layoutIfNeeded();

    label->sizeToFit();

    EXPECT_EQ(label->frame(), (Rect{{10, 20}, {72, 14.4}}));
    EXPECT_TRUE(label->needsLayout());
}

TEST_F(ViewLooksTest, SizedToFitAgainNothingChanges) {
    const auto label = std::make_shared<Label>(platform.services(), Rect{});
    label->setText("twelve bytes");
    label->sizeToFit();
    label->layoutIfNeeded();

    label->sizeToFit();

    EXPECT_FALSE(label->needsLayout());
}

TEST_F(ViewLooksTest, ADirectionThatDoesNotMatterStaysAsItIs) {
    const Rect frame{.origin = {1, 2}, .size = {30, 40}};
    ProgressView bar(platform.services(), ProgressViewStyle::standard);
    bar.setFrame(frame);
    view->setFrame(frame);

    bar.sizeToFit();
    view->sizeToFit();

    EXPECT_EQ(bar.frame(), (Rect{{1, 2}, {30, platform.viewMetrics.barHeight}}));
    EXPECT_EQ(view->frame(), frame);
}

} // namespace
} // namespace nimbra
