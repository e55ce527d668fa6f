#include "platform/views/Button.h"

#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra {
namespace {

struct ButtonTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<Button> button =
        Button::buttonWithType(ButtonType::system, platform.services());
    std::shared_ptr<int> target = std::make_shared<int>(0);
    std::vector<std::string> told;

    void addTarget(std::weak_ptr<void> of, std::string name,
                   ControlEvent event = ControlEvent::touchUpInside) {
        button->addTargetActionForControlEvents(
            std::move(of), [this, name = std::move(name)](const auto&) { told.push_back(name); },
            event);
    }
};

using Names = std::vector<std::string>;

TEST_F(ButtonTest, ANewButtonHasNoTitleAndCanBeTouched) {
    EXPECT_EQ(button->buttonType(), ButtonType::system);
    EXPECT_EQ(button->titleForState(ControlState::normal), Text());
    EXPECT_EQ(button->tintColor(), Color::black);
    EXPECT_TRUE(button->isEnabled());
    EXPECT_TRUE(button->isUserInteractionEnabled());
    EXPECT_EQ(button->frame(), Rect{});
    EXPECT_TRUE(button->subviews().empty());
}

TEST_F(ButtonTest, TheTitleStandsInItsLabel) {
    const Text title("Upgrade");

    button->setTitleForState(title, ControlState::normal);
    button->setTintColor(Color::systemBlue);

    EXPECT_TRUE(button->titleForState(ControlState::normal).isSameObjectAs(title));
    EXPECT_TRUE(button->titleLabel()->text().isSameObjectAs(title));
    EXPECT_EQ(button->tintColor(), Color::systemBlue);
}

TEST_F(ButtonTest, TheSizeIsThatOfTheTitleInItsFontWithTheRoomAroundIt) {
    button->setTitleForState("letters", ControlState::normal);
    button->titleLabel()->setFont(Font::_lightSystemFontOfSize(24));
    button->setFrame({.origin = {3, 4}, .size = {1, 1}});

    button->sizeToFit();

    EXPECT_EQ(button->frame(), (Rect{{3, 4}, {42, 28.8 + 12}}));
}

TEST_F(ButtonTest, OnlyAnotherTitleAsksForALayout) {
    const auto root = std::make_shared<View>(platform.services(), Rect{});
    root->addSubview(button);
    root->layoutIfNeeded();

    button->setTitleForState("Upgrade", ControlState::normal);
    EXPECT_TRUE(button->needsLayout());
    EXPECT_TRUE(root->needsLayout());
    root->layoutIfNeeded();
    button->setTitleForState(std::string("Upgrade"), ControlState::normal);

    EXPECT_FALSE(button->needsLayout());
    EXPECT_FALSE(root->needsLayout());
}

TEST_F(ButtonTest, ATouchTellsTheTargetOnceWhoWasTouched) {
    std::vector<std::shared_ptr<Button>> senders;
    button->addTargetActionForControlEvents(
        target, [&senders](const std::shared_ptr<Button>& sender) { senders.push_back(sender); },
        ControlEvent::touchUpInside);

    button->touch();

    EXPECT_EQ(senders, (std::vector<std::shared_ptr<Button>>{button}));
}

TEST_F(ButtonTest, TargetsAreToldInTheOrderInWhichTheyCame) {
    const auto other = std::make_shared<int>(0);
    addTarget(target, "first");
    addTarget(other, "second");
    addTarget(target, "third");

    button->touch();

    EXPECT_EQ(told, Names({"first", "second", "third"}));
}

TEST_F(ButtonTest, ATargetOfAnotherEventIsNotTold) {
    addTarget(target, "value", ControlEvent::valueChanged);
    addTarget(target, "touch", ControlEvent::touchUpInside);

    button->touch();

    EXPECT_EQ(told, Names({"touch"}));
}

TEST_F(ButtonTest, ADisabledButtonTellsNobodyUntilItIsEnabled) {
    addTarget(target, "told");
    button->setEnabled(false);
    button->touch();
    EXPECT_EQ(told, Names());

    button->setEnabled(true);
    button->touch();

    EXPECT_EQ(told, Names({"told"}));
}

TEST_F(ButtonTest, AButtonThatTakesNoTouchesTellsNobody) {
    addTarget(target, "told");
    button->setUserInteractionEnabled(false);
    button->touch();
    EXPECT_EQ(told, Names());

    button->setUserInteractionEnabled(true);
    button->touch();

    EXPECT_EQ(told, Names({"told"}));
}

TEST_F(ButtonTest, ATargetIsHeldWeakly) {
    const std::weak_ptr<int> seen = target;
    addTarget(target, "gone");

    target.reset();
    button->touch();

    EXPECT_TRUE(seen.expired());
    EXPECT_EQ(told, Names());
}

TEST_F(ButtonTest, ATargetThatLetsItselfGoLivesUntilItHasBeenTold) {
    const std::weak_ptr<int> seen = target;
    bool livedOn = false;
    button->addTargetActionForControlEvents(
        target,
        [this, &seen, &livedOn](const auto&) {
            target.reset();
            livedOn = !seen.expired();
        },
        ControlEvent::touchUpInside);

    button->touch();

    EXPECT_TRUE(livedOn);
    EXPECT_TRUE(seen.expired());
}

TEST_F(ButtonTest, ATargetThatGoesBeforeItsTurnIsNotTold) {
    auto later = std::make_shared<int>(0);
    button->addTargetActionForControlEvents(
        target, [&later](const auto&) { later.reset(); }, ControlEvent::touchUpInside);
    addTarget(later, "later");

    button->touch();

    EXPECT_EQ(told, Names());
}

TEST_F(ButtonTest, ATargetThatComesDuringATouchIsToldOfTheNext) {
    button->addTargetActionForControlEvents(
        target,
        [this](const auto&) {
            if (told.empty()) {
                addTarget(target, "new");
                told.emplace_back("first touch");
            }
        },
        ControlEvent::touchUpInside);

    button->touch();
    EXPECT_EQ(told, Names({"first touch"}));
    button->touch();

    EXPECT_EQ(told, Names({"first touch", "new"}));
}

TEST_F(ButtonTest, AButtonThatGoesDuringATouchTellsEverybodyAllTheSame) {
    const std::weak_ptr<Button> seen = button;
    button->addTargetActionForControlEvents(
        target, [this](const auto&) { button.reset(); }, ControlEvent::touchUpInside);
    addTarget(target, "second");

    button->touch();

    EXPECT_EQ(told, Names({"second"}));
    EXPECT_TRUE(seen.expired());
}

} // namespace
} // namespace nimbra
