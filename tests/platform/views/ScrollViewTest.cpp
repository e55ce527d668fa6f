#include "platform/views/ScrollView.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

TEST(ScrollViewTest, ItsContentMayBeLargerThanItself) {
    test::TestPlatform platform;
    const Rect frame{.origin = {0, 0}, .size = {100, 200}};
    ScrollView view(platform.services(), frame);
    EXPECT_EQ(view.contentSize(), Size{});

    view.setContentSize({100, 900});

    EXPECT_EQ(view.contentSize(), (Size{100, 900}));
    EXPECT_EQ(view.frame(), frame);
}

} // namespace
} // namespace nimbra
