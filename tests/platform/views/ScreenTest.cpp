#include "platform/views/Screen.h"

#include <gtest/gtest.h>
#include <optional>

namespace nimbra {
namespace {

std::optional<Screen> screenOf(double scale) {
    return Screen{.bounds = {.origin = {}, .size = {320, 480}}, .scale = scale};
}

TEST(ScreenTest, WithoutAScaleAPixelIsAPoint) {
    EXPECT_EQ(Screen().scale, 1);
    EXPECT_EQ(RoundToViewScale(10.4, screenOf(1)), 10);
    EXPECT_EQ(RoundToViewScale(10.5, screenOf(1)), 11);
}

TEST(ScreenTest, WithTwoPixelsAPointAHalfIsAnEdge) {
    EXPECT_EQ(RoundToViewScale(10.2, screenOf(2)), 10);
    EXPECT_EQ(RoundToViewScale(10.25, screenOf(2)), 10.5);
    EXPECT_EQ(RoundToViewScale(10.5, screenOf(2)), 10.5);
    EXPECT_EQ(RoundToViewScale(10.8, screenOf(2)), 11);
}

TEST(ScreenTest, WithThreePixelsAPointAThirdIsAnEdge) {
    EXPECT_EQ(RoundToViewScale(10.1, screenOf(3)), 10);
    EXPECT_EQ(RoundToViewScale(10.3, screenOf(3)), 31 / 3.0);
    EXPECT_EQ(RoundToViewScale(10.5, screenOf(3)), 32 / 3.0);
    EXPECT_EQ(RoundToViewScale(10.9, screenOf(3)), 11);
}

TEST(ScreenTest, WithoutAScreenAPixelIsAPoint) {
    EXPECT_EQ(RoundToViewScale(10.4, std::nullopt), 10);
    EXPECT_EQ(RoundToViewScale(10.5, std::nullopt), 11);
}

TEST(ScreenTest, BelowZeroTheFartherEdgeIsChosenToo) {
    EXPECT_EQ(RoundToViewScale(-10.4, screenOf(1)), -10);
    EXPECT_EQ(RoundToViewScale(-10.5, screenOf(1)), -11);
    EXPECT_EQ(RoundToViewScale(-10.25, screenOf(2)), -10.5);
    EXPECT_EQ(RoundToViewScale(-10.2, screenOf(2)), -10);
}

} // namespace
} // namespace nimbra
