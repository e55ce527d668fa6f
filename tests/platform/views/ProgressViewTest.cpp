#include "platform/views/ProgressView.h"

#include "tests/support/TestPlatform.h"

#include <cmath>
#include <gtest/gtest.h>

namespace nimbra {
namespace {

struct ProgressViewTest : testing::Test {
    test::TestPlatform platform;
    ProgressView bar{platform.services(), ProgressViewStyle::standard};
};

TEST_F(ProgressViewTest, ANewBarHasNotBegun) {
    EXPECT_EQ(bar.style(), ProgressViewStyle::standard);
    EXPECT_EQ(bar.progress(), 0);
    EXPECT_FALSE(bar.isProgressAnimated());
    EXPECT_EQ(bar.frame(), Rect{});
}

TEST_F(ProgressViewTest, ProgressIsKeptWithTheWayToShowIt) {
    bar.setProgressAnimated(0.25F, true);
    EXPECT_EQ(bar.progress(), 0.25F);
    EXPECT_TRUE(bar.isProgressAnimated());

    bar.setProgressAnimated(0.5F, false);

    EXPECT_EQ(bar.progress(), 0.5F);
    EXPECT_FALSE(bar.isProgressAnimated());
}

TEST_F(ProgressViewTest, ProgressStaysBetweenNothingAndAll) {
    const auto shown = [this](float progress) {
        bar.setProgressAnimated(progress, false);
        return bar.progress();
    };

    EXPECT_EQ(shown(1.5F), 1);
    EXPECT_EQ(shown(-0.5F), 0);
    EXPECT_EQ(shown(INFINITY), 1);
    EXPECT_EQ(shown(-INFINITY), 0);
    EXPECT_EQ(shown(NAN), 0);
}

TEST_F(ProgressViewTest, TheBarHasAHeightOfItsOwnAndAnyWidth) {
    platform.viewMetrics.barHeight = 6;

    EXPECT_EQ(bar.intrinsicContentSize(), (Size{ViewNoIntrinsicMetric, 6}));
    EXPECT_EQ(bar.heightForWidth(10), 6);
}

} // namespace
} // namespace nimbra
