#include "platform/host/ViewController.h"

#include "platform/host/AlertController.h"
#include "platform/host/SetupController.h"
#include "platform/views/View.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra {
namespace {

/// Writes down what it is told.
class RecordingScreen final : public ViewController {
public:
    using ViewController::dismissAnimated;
    using ViewController::dismissViewControllerAnimated;
    using ViewController::presentViewControllerAnimated;
    using ViewController::setTitle;
    using ViewController::setView;
    using ViewController::ViewController;

    void loadView() override {
        told.emplace_back(view() ? "load again" : "load");
        ViewController::loadView();
    }
    void viewDidLoad() override {
        ViewController::viewDidLoad();
        told.emplace_back(view() ? "loaded" : "loaded without a view");
    }
    void viewWillLayoutSubviews() override {
        ViewController::viewWillLayoutSubviews();
        told.emplace_back(view()->needsLayout() ? "will lay out" : "has been laid out");
    }
    void reloadSpecifiers() override { told.emplace_back("reload"); }

    std::vector<std::string> told;
};

using Calls = std::vector<std::string>;

struct ViewControllerTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<RecordingScreen> screen =
        std::make_shared<RecordingScreen>(platform.services());

    [[nodiscard]] Calls takeTold() const { return std::exchange(screen->told, {}); }
};

TEST_F(ViewControllerTest, TheViewIsLoadedOnceAndThenTold) {
    EXPECT_EQ(screen->view(), nullptr);

    screen->loadViewIfNeeded();
    const auto view = screen->view();
    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->told, Calls({"load", "loaded"}));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(screen->view(), view);
    EXPECT_EQ(view->frame(), Rect{});
}

TEST_F(ViewControllerTest, BeforeTheViewIsLoadedThereIsNothingToLayOut) {
    screen->layoutViewIfNeeded();

    EXPECT_EQ(screen->told, Calls());
    EXPECT_EQ(screen->view(), nullptr);
}

TEST_F(ViewControllerTest, TheControllerGoesBeforeALayoutOfItsView) {
    screen->loadViewIfNeeded();
    static_cast<void>(takeTold());

    screen->layoutViewIfNeeded();

    EXPECT_EQ(takeTold(), Calls({"will lay out"}));
    EXPECT_FALSE(screen->view()->needsLayout());
}

TEST_F(ViewControllerTest, AViewThatAsksForNothingIsNotLaidOut) {
    screen->loadViewIfNeeded();
    screen->layoutViewIfNeeded();
    static_cast<void>(takeTold());

    screen->layoutViewIfNeeded();
    EXPECT_EQ(takeTold(), Calls());
    screen->view()->setNeedsLayout();
    screen->layoutViewIfNeeded();

    EXPECT_EQ(takeTold(), Calls({"will lay out"}));
}

TEST_F(ViewControllerTest, AViewInsideIsLaidOutWithoutTheController) {
    screen->loadViewIfNeeded();
    const auto inner = std::make_shared<View>(platform.services(), Rect{});
    screen->view()->addSubview(inner);
    screen->layoutViewIfNeeded();
    static_cast<void>(takeTold());

    inner->setNeedsLayout();
    screen->layoutViewIfNeeded();

    EXPECT_EQ(takeTold(), Calls());
    EXPECT_FALSE(inner->needsLayout());
}

TEST_F(ViewControllerTest, AnotherViewTakesThePlaceOfTheFirst) {
    screen->loadViewIfNeeded();
    const auto other = std::make_shared<View>(platform.services(), Rect{});

    screen->setView(other);
    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->view(), other);
    EXPECT_EQ(screen->told, Calls({"load", "loaded"}));
}

TEST_F(ViewControllerTest, TheTitleIsAbsentUntilItIsSet) {
    EXPECT_EQ(screen->title(), Text());

    screen->setTitle("Nimbra Drive");

    EXPECT_EQ(screen->title(), Text("Nimbra Drive"));
}

TEST_F(ViewControllerTest, ControllersAndAlertsArePresentedByTheHost) {
    const auto holder = std::make_shared<SetupController>(nullptr);
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        "Title", "Message", AlertControllerStyle::alert);

    screen->presentViewControllerAnimated(holder, true);
    screen->presentViewControllerAnimated(holder, false);
    screen->presentViewControllerAnimated(alert, true);
    screen->presentViewControllerAnimated(alert, false);

    EXPECT_EQ(platform.calls, Calls({"present controller, animated", "present controller",
                                     "alert, animated: Title", "alert: Title"}));
    EXPECT_EQ(platform.presenter.presented, holder);
    EXPECT_EQ(platform.presenter.alert, alert);
}

TEST_F(ViewControllerTest, WhatIsPresentedIsDismissedByTheHost) {
    screen->dismissViewControllerAnimated(true);
    screen->dismissViewControllerAnimated(false);

    EXPECT_EQ(platform.calls, Calls({"dismiss presented, animated", "dismiss presented"}));
    EXPECT_EQ(platform.presenter.dismissed, nullptr);
}

TEST_F(ViewControllerTest, AControllerDismissesItselfByTheHost) {
    screen->dismissAnimated(true);
    screen->dismissAnimated(false);

    EXPECT_EQ(platform.calls, Calls({"dismiss itself, animated", "dismiss itself"}));
    EXPECT_EQ(platform.presenter.dismissed, screen.get());
}

TEST_F(ViewControllerTest, AFormSheetAndAPageSheetAreSheets) {
    const auto holder = std::make_shared<SetupController>(nullptr);
    screen->setParentController(holder);

    holder->setModalPresentationStyle(ModalPresentationStyle::formSheet);
    EXPECT_TRUE(screen->isPresentedAsModalSheet());
    holder->setModalPresentationStyle(ModalPresentationStyle::pageSheet);
    EXPECT_TRUE(screen->isPresentedAsModalSheet());
    holder->setModalPresentationStyle(ModalPresentationStyle::fullScreen);

    EXPECT_FALSE(screen->isPresentedAsModalSheet());
}

TEST_F(ViewControllerTest, APageThatNobodyPresentedIsNoSheet) {
    EXPECT_FALSE(screen->isPresentedAsModalSheet());

    const auto page = std::make_shared<RecordingScreen>(platform.services());
    screen->setParentController(page);

    EXPECT_FALSE(screen->isPresentedAsModalSheet());
}

TEST_F(ViewControllerTest, ASheetThatHasGoneHoldsNoPage) {
    auto holder = std::make_shared<SetupController>(nullptr);
    holder->setModalPresentationStyle(ModalPresentationStyle::formSheet);
    screen->setParentController(holder);
    ASSERT_TRUE(screen->isPresentedAsModalSheet());

    holder.reset();

    EXPECT_FALSE(screen->isPresentedAsModalSheet());
}

} // namespace
} // namespace nimbra
