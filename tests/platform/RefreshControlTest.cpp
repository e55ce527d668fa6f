#include "platform/views/RefreshControl.h"

#include <gtest/gtest.h>

namespace nimbra {
namespace {

struct RefreshControlTest : testing::Test {
    std::shared_ptr<RefreshControl> control = std::make_shared<RefreshControl>();
    std::shared_ptr<int> target = std::make_shared<int>(0);
    std::shared_ptr<RefreshControl> sender;

    void addTarget() {
        control->addTargetActionForControlEvents(
            target,
            [this](const std::shared_ptr<RefreshControl>& from) {
                ++*target;
                sender = from;
            },
            ControlEvent::valueChanged);
    }
};

TEST_F(RefreshControlTest, APullTellsTheTargetWhoFired) {
    addTarget();

    control->pull();

    EXPECT_EQ(*target, 1);
    EXPECT_EQ(sender, control);
    EXPECT_TRUE(control->isRefreshing());
}

TEST_F(RefreshControlTest, APullDuringARefreshIsNotTold) {
    addTarget();
    control->pull();

    control->pull();

    EXPECT_EQ(*target, 1);
}

TEST_F(RefreshControlTest, AfterTheEndAPullIsToldAgain) {
    addTarget();
    control->pull();
    control->endRefreshing();
    EXPECT_FALSE(control->isRefreshing());

    control->pull();

    EXPECT_EQ(*target, 2);
}

TEST_F(RefreshControlTest, ATargetThatHasGoneIsNotTold) {
    int told = 0;
    control->addTargetActionForControlEvents(
        target, [&told](const auto&) { ++told; }, ControlEvent::valueChanged);
    target.reset();

    control->pull();

    EXPECT_EQ(told, 0);
    EXPECT_TRUE(control->isRefreshing());
}

TEST_F(RefreshControlTest, TheEndObserverIsToldOfEachEnd) {
    int ends = 0;
    control->setEndObserver([&ends] { ++ends; });

    control->endRefreshing();
    control->endRefreshing();

    EXPECT_EQ(ends, 2);
}

} // namespace
} // namespace nimbra
