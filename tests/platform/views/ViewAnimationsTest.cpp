#include "platform/views/ViewAnimations.h"

#include "platform/views/View.h"
#include "tests/support/TestPlatform.h"

#include <chrono>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra {
namespace {

using std::chrono::duration;

/// A view that begins invisible.
struct InvisibleView final : View {
    explicit InvisibleView(const PlatformServices& services) : View(services, {}) { setAlpha(0); }
};

struct ViewAnimationsTest : testing::Test {
    test::TestPlatform platform;
    ViewAnimations& animations = platform.viewAnimations;
    std::shared_ptr<View> view = std::make_shared<View>(platform.services(), Rect{});
    std::shared_ptr<View> other = std::make_shared<View>(platform.services(), Rect{});
    std::vector<ViewAnimation> shown;

    void SetUp() override {
        animations.setObserver(
            [this](const ViewAnimation& animation) { shown.push_back(animation); });
    }
    static void expectChange(const ViewAnimation::Change& change, const std::shared_ptr<View>& of,
                             double alpha) {
        EXPECT_EQ(change.view, of);
        EXPECT_EQ(change.alpha, alpha);
    }
};

TEST_F(ViewAnimationsTest, WhatChangesBetweenTheBeginningAndTheEndIsShownOverTime) {
    animations.beginAnimations("FadeIn");
    animations.setAnimationDuration(duration<double>(0.5));
    view->setAlpha(0.25);
    other->setAlpha(0.75);
    EXPECT_TRUE(shown.empty());

    animations.commitAnimations();

    ASSERT_EQ(shown.size(), 1U);
    EXPECT_EQ(shown[0].name, Text("FadeIn"));
    EXPECT_EQ(shown[0].duration, duration<double>(0.5));
    ASSERT_EQ(shown[0].changes.size(), 2U);
    expectChange(shown[0].changes[0], view, 0.25);
    expectChange(shown[0].changes[1], other, 0.75);
}

TEST_F(ViewAnimationsTest, AViewHasItsNewOpacityAtOnce) {
    animations.beginAnimations("FadeOut");

    view->setAlpha(0);

    EXPECT_EQ(view->alpha(), 0);
}

TEST_F(ViewAnimationsTest, WithoutAWordAnAnimationTakesAFifthOfASecond) {
    animations.beginAnimations("FadeIn");
    view->setAlpha(0);
    animations.commitAnimations();

    EXPECT_EQ(shown.at(0).duration, duration<double>(0.2));
}

TEST_F(ViewAnimationsTest, WhatChangesOutsideIsNoPartOfAnAnimation) {
    view->setAlpha(0.5);
    animations.beginAnimations("FadeIn");
    animations.commitAnimations();
    other->setAlpha(0.5);

    ASSERT_EQ(shown.size(), 1U);
    EXPECT_TRUE(shown[0].changes.empty());
}

TEST_F(ViewAnimationsTest, AnOpacityThatStaysIsNoChange) {
    view->setAlpha(0);
    animations.beginAnimations("FadeIn");
    view->setAlpha(0);
    view->setAlpha(-1);
    other->setAlpha(1);
    animations.commitAnimations();

    EXPECT_TRUE(shown.at(0).changes.empty());
}

TEST_F(ViewAnimationsTest, OfNestedAnimationsTheInnerOneEndsFirst) {
    animations.beginAnimations("outer");
    animations.setAnimationDuration(duration<double>(2));
    view->setAlpha(0.5);
    animations.beginAnimations("inner");
    animations.setAnimationDuration(duration<double>(1));
    other->setAlpha(0.5);
    animations.commitAnimations();
    view->setAlpha(0.25);
    animations.commitAnimations();

    ASSERT_EQ(shown.size(), 2U);
    EXPECT_EQ(shown[0].name, Text("inner"));
    EXPECT_EQ(shown[0].duration, duration<double>(1));
    ASSERT_EQ(shown[0].changes.size(), 1U);
    expectChange(shown[0].changes[0], other, 0.5);
    EXPECT_EQ(shown[1].name, Text("outer"));
    EXPECT_EQ(shown[1].duration, duration<double>(2));
    ASSERT_EQ(shown[1].changes.size(), 2U);
    expectChange(shown[1].changes[0], view, 0.5);
    expectChange(shown[1].changes[1], view, 0.25);
}

TEST_F(ViewAnimationsTest, WithoutABeginningThereIsNothingToCommit) {
    animations.setAnimationDuration(duration<double>(3));
    animations.commitAnimations();
    EXPECT_TRUE(shown.empty());

    animations.beginAnimations("FadeIn");
    animations.commitAnimations();
    animations.commitAnimations();

    ASSERT_EQ(shown.size(), 1U);
    EXPECT_EQ(shown[0].duration, duration<double>(0.2));
}

TEST_F(ViewAnimationsTest, AnAnimationHoldsItsViewsUntilItIsCommitted) {
    animations.setObserver(nullptr);
    const std::weak_ptr<View> seen = view;
    animations.beginAnimations("FadeOut");
    view->setAlpha(0);
    view.reset();
    EXPECT_FALSE(seen.expired());

    animations.commitAnimations();

    EXPECT_TRUE(seen.expired());
}

TEST_F(ViewAnimationsTest, WhoeverIsToldMayBeginAnotherAnimation) {
    std::vector<Text> names;
    animations.setObserver([this, &names](const ViewAnimation& animation) {
        names.push_back(animation.name);
        if (names.size() == 1) {
            animations.beginAnimations("second");
            animations.commitAnimations();
        }
    });

    animations.beginAnimations("first");
    animations.commitAnimations();

    EXPECT_EQ(names, (std::vector<Text>{"first", "second"}));
}

TEST_F(ViewAnimationsTest, AViewThatIsBeingMadeIsNoPartOfAnAnimation) {
    animations.beginAnimations("FadeIn");
    const auto invisible = std::make_shared<InvisibleView>(platform.services());
    animations.commitAnimations();

    EXPECT_EQ(invisible->alpha(), 0);
    EXPECT_TRUE(shown.at(0).changes.empty());
}

} // namespace
} // namespace nimbra
