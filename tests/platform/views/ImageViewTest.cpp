#include "platform/views/ImageView.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra {
namespace {

struct ImageViewTest : testing::Test {
    test::TestPlatform platform;
};

TEST_F(ImageViewTest, TheViewIsAsLargeAsItsImage) {
    const auto image = std::make_shared<const Image>(Image{.name = "logo", .size = {64, 48}});

    ImageView view(platform.services(), image);

    EXPECT_EQ(view.image(), image);
    EXPECT_EQ(view.frame(), (Rect{{0, 0}, {64, 48}}));
    EXPECT_EQ(view.intrinsicContentSize(), (Size{64, 48}));
}

TEST_F(ImageViewTest, ItReturnsToTheSizeOfItsImage) {
    ImageView view(platform.services(),
                   std::make_shared<const Image>(Image{.name = "logo", .size = {64, 48}}));
    view.setFrame({.origin = {5, 6}, .size = {1, 1}});

    view.sizeToFit();

    EXPECT_EQ(view.frame(), (Rect{{5, 6}, {64, 48}}));
}

TEST_F(ImageViewTest, WithoutAnImageItIsEmpty) {
    ImageView view(platform.services(), nullptr);
    EXPECT_EQ(view.image(), nullptr);
    EXPECT_EQ(view.frame(), Rect{});
    view.setFrame({.origin = {5, 6}, .size = {7, 8}});

    view.sizeToFit();

    EXPECT_EQ(view.frame(), (Rect{{5, 6}, {0, 0}}));
}

} // namespace
} // namespace nimbra
