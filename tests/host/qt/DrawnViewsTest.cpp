#include "host/qt/DrawnViews.h"

#include "host/qt/WindowMetrics.h"
#include "platform/views/ProgressView.h"
#include "platform/views/View.h"
#include "tests/support/TestPlatform.h"

#include <QSignalSpy>
#include <gtest/gtest.h>
#include <memory>

namespace nimbra::window {

namespace {

class DrawnViewsTest : public testing::Test {
protected:
    DrawnViewsTest() {
        root->addSubview(bar);
        bar->setFrame({.origin = {.x = 16, .y = 40}, .size = {.width = 200, .height = 4}});
    }

    [[nodiscard]] QVariant valueOf(int role) const { return drawn.data(drawn.index(0), role); }

    test::TestPlatform platform;
    PlatformServices services = platform.services();
    std::shared_ptr<View> root = std::make_shared<View>(services, Rect{});
    std::shared_ptr<ProgressView> bar =
        std::make_shared<ProgressView>(services, ProgressViewStyle::standard);
    WindowMetrics metrics;
    DrawnViews drawn{
        {.metrics = metrics, .pictureUrl = [](const std::string&) { return QString(); }}};
};

} // namespace

TEST_F(DrawnViewsTest, ABarSaysHowFarItIsAndWhetherItMovesThere) {
    bar->setProgressAnimated(0.25F, true);
    drawn.show(root.get());

    ASSERT_EQ(drawn.rowCount(), 1);
    EXPECT_EQ(valueOf(DrawnViews::KindRole).toString(), QStringLiteral("bar"));
    EXPECT_EQ(valueOf(DrawnViews::FrameRole).toRectF(), QRectF(16, 40, 200, 4));
    EXPECT_EQ(valueOf(DrawnViews::ProgressRole).toFloat(), 0.25F);
    EXPECT_TRUE(valueOf(DrawnViews::IsProgressAnimatedRole).isValid());
    EXPECT_TRUE(valueOf(DrawnViews::IsProgressAnimatedRole).toBool());

    // Then it jumps, and the same bar is told so.
    QSignalSpy changes(&drawn, &DrawnViews::dataChanged);
    QSignalSpy resets(&drawn, &DrawnViews::modelReset);
    bar->setProgressAnimated(0.5F, false);
    drawn.show(root.get());

    EXPECT_EQ(changes.count(), 1);
    EXPECT_EQ(resets.count(), 0);
    EXPECT_EQ(valueOf(DrawnViews::ProgressRole).toFloat(), 0.5F);
    EXPECT_TRUE(valueOf(DrawnViews::IsProgressAnimatedRole).isValid());
    EXPECT_FALSE(valueOf(DrawnViews::IsProgressAnimatedRole).toBool());
}

TEST_F(DrawnViewsTest, AHiddenViewIsNotDrawn) {
    drawn.show(root.get());
    ASSERT_EQ(drawn.rowCount(), 1);

    bar->setHidden(true);
    drawn.show(root.get());
    EXPECT_EQ(drawn.rowCount(), 0);

    // Nor is what stands in one.
    bar->setHidden(false);
    root->setHidden(true);
    drawn.show(root.get());
    EXPECT_EQ(drawn.rowCount(), 0);
}

TEST_F(DrawnViewsTest, ThePagesKnowEveryRoleByAName) {
    const auto names = drawn.roleNames();

    EXPECT_EQ(names.value(DrawnViews::ProgressRole), "progress");
    EXPECT_EQ(names.value(DrawnViews::IsProgressAnimatedRole), "isProgressAnimated");
}

} // namespace nimbra::window
