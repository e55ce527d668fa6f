#include "platform/views/ActivityIndicatorView.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

struct ActivityIndicatorViewTest : testing::Test {
    test::TestPlatform platform;
    ActivityIndicatorView spinner{platform.services(), ActivityIndicatorViewStyle::gray};
};

TEST_F(ActivityIndicatorViewTest, ANewSpinnerRestsAndIsAsLargeAsTheHostsAre) {
    EXPECT_EQ(spinner.style(), ActivityIndicatorViewStyle::gray);
    EXPECT_FALSE(spinner.isAnimating());
    EXPECT_EQ(spinner.frame(), (Rect{{0, 0}, {20, 20}}));
    EXPECT_EQ(spinner.intrinsicContentSize(), (Size{20, 20}));
}

TEST_F(ActivityIndicatorViewTest, ASpinnerTurnsFromItsStartToItsStop) {
    spinner.startAnimating();
    EXPECT_TRUE(spinner.isAnimating());

    spinner.stopAnimating();

    EXPECT_FALSE(spinner.isAnimating());
}

TEST_F(ActivityIndicatorViewTest, OneStopEndsSeveralStarts) {
    spinner.startAnimating();
    spinner.startAnimating();

    spinner.stopAnimating();

    EXPECT_FALSE(spinner.isAnimating());
}

} // namespace
} // namespace nimbra
