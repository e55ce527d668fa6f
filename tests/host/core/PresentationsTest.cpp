#include "host/core/Presentations.h"

#include "platform/host/AccountAlertView.h"
#include "platform/host/AccountSettingsPane.h"
#include "platform/host/SetupController.h"
#include "platform/views/Button.h"
#include "platform/views/View.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

using Calls = std::vector<std::string>;

/// A page with a button in a view of its own.
class ButtonPage final : public AccountSettingsPane {
public:
    ButtonPage(const PlatformServices& services, Calls& calls)
        : AccountSettingsPane(services), _calls(calls) {}

    const SpecifierArray& specifiers() override { return _rows; }
    void loadView() override {
        AccountSettingsPane::loadView();
        const auto root = std::make_shared<View>(services(), Rect());
        const auto content = std::make_shared<View>(services(), Rect());
        root->addSubview(content);
        for (const char* title : {"Later", "Now"}) {
            const auto button = Button::buttonWithType(ButtonType::system, services());
            button->setTitleForState(title, ControlState::normal);
            button->setEnabled(std::string(title) == "Now");
            button->addTargetActionForControlEvents(
                weak_from_this(), [this](const auto&) { _calls.emplace_back("touched"); },
                ControlEvent::touchUpInside);
            content->addSubview(button);
        }
        setView(root);
    }
    void viewDidAppear(bool animated) override {
        AccountSettingsPane::viewDidAppear(animated);
        _calls.emplace_back(view()->window() != nullptr ? "appears" : "appears nowhere");
    }
    void viewDidDisappear(bool animated) override {
        AccountSettingsPane::viewDidDisappear(animated);
        _calls.emplace_back("disappears");
    }
    void viewWillLayoutSubviews() override {
        _calls.push_back("lays out " +
                         std::to_string(static_cast<int>(view()->frame().size.width)));
    }
    void cancelButtonTapped(const BarButtonItem& /*sender*/) override {
        _calls.emplace_back("cancel");
    }

private:
    SpecifierArray _rows;
    Calls& _calls;
};

class PresentationsTest : public testing::Test {
protected:
    void present() { _presentations.present(_sheet); }
    void presentAlert() {
        const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
            "Sure?", "Really?", AlertControllerStyle::alert);
        alert->addAction(
            AlertAction::actionWithTitleStyleHandler("No", AlertActionStyle::cancel, {}));
        alert->addAction(
            AlertAction::actionWithTitleStyleHandler("Yes", AlertActionStyle::standard, [this] {
                _calls.emplace_back(_presentations.alert() == nullptr ? "yes" : "yes, too early");
            }));
        _presentations.present(alert);
    }
    Calls takeCalls() { return std::exchange(_calls, {}); }

    test::TestPlatform _platform;
    Calls _calls;
    std::shared_ptr<ButtonPage> _page = std::make_shared<ButtonPage>(_platform.services(), _calls);
    std::shared_ptr<SetupController> _sheet = std::make_shared<SetupController>(_page);
    Presentations _presentations;
};

TEST_F(PresentationsTest, ShowNothingAtFirst) {
    EXPECT_EQ(_presentations.screen(), nullptr);
    EXPECT_EQ(_presentations.alert(), nullptr);
    EXPECT_EQ(_presentations.usableButton(), nullptr);
    EXPECT_EQ(_presentations.answerAlert("Yes").error(), "no alert is shown");
    EXPECT_EQ(_presentations.touchButton("Now").error(), "no screen is presented");
    _presentations.dismissScreen();
    _presentations.layOut();
}

TEST_F(PresentationsTest, LoadAScreenAndShowItInAWindow) {
    present();

    EXPECT_EQ(_presentations.screen(), _page);
    EXPECT_NE(_page->view()->window(), nullptr);
    EXPECT_EQ(takeCalls(), Calls{"appears"});
}

TEST_F(PresentationsTest, ShowOneScreenAtATime) {
    present();
    const auto second = std::make_shared<ButtonPage>(_platform.services(), _calls);
    _presentations.present(std::make_shared<SetupController>(second));

    EXPECT_EQ(_presentations.screen(), _page);
    EXPECT_EQ(second->view(), nullptr);
}

TEST_F(PresentationsTest, LetADismissedScreenGo) {
    present();
    presentAlert();
    static_cast<void>(takeCalls());
    const std::weak_ptr<ButtonPage> weakPage = _page;

    _presentations.dismissScreen();

    EXPECT_EQ(takeCalls(), Calls{"disappears"});
    EXPECT_EQ(_presentations.screen(), nullptr);
    EXPECT_EQ(_presentations.alert(), nullptr);
    EXPECT_EQ(_page->view()->window(), nullptr);
    _page.reset();
    _sheet.reset();
    EXPECT_TRUE(weakPage.expired());
}

TEST_F(PresentationsTest, KeepAnAlertOfTheAccountOverADismissedScreen) {
    present();
    const auto told = std::make_shared<AccountAlertView>(
        _platform.services(), "Failed",
        AccountAlertView::Content{.message = "It did not work.",
                                  .buttonTitle = "OK",
                                  .action = [this] { _calls.emplace_back("ok"); }});
    _presentations.present(told);
    _presentations.dismissScreen();

    ASSERT_NE(_presentations.alert(), nullptr);
    EXPECT_EQ(_presentations.alert()->title, Text("Failed"));
    EXPECT_EQ(_presentations.alert()->message, Text("It did not work."));
    EXPECT_TRUE(_presentations.alert()->isOfAccount);
    static_cast<void>(takeCalls());
    ASSERT_TRUE(_presentations.answerAlert("OK"));
    EXPECT_EQ(takeCalls(), Calls{"ok"});
    EXPECT_EQ(_presentations.alert(), nullptr);
}

TEST_F(PresentationsTest, DismissAllLeavesNothing) {
    present();
    presentAlert();
    _presentations.present(std::make_shared<AccountAlertView>(
        _platform.services(), "Failed", AccountAlertView::Content{.buttonTitle = "OK"}));

    _presentations.dismissAll();

    EXPECT_EQ(_presentations.screen(), nullptr);
    EXPECT_EQ(_presentations.alert(), nullptr);
}

TEST_F(PresentationsTest, AnswerTheAlertOnTopAfterItHasGone) {
    presentAlert();
    presentAlert();

    ASSERT_TRUE(_presentations.answerAlert("No"));
    EXPECT_NE(_presentations.alert(), nullptr);
    ASSERT_TRUE(_presentations.answerAlert("Yes"));

    EXPECT_EQ(takeCalls(), Calls{"yes"});
    EXPECT_EQ(_presentations.alert(), nullptr);
}

TEST_F(PresentationsTest, RefuseAnAnswerThatTheAlertDoesNotHave) {
    presentAlert();

    EXPECT_EQ(_presentations.answerAlert("Maybe").error(),
              "the alert has no answer \"Maybe\" (answers: \"No\", \"Yes\")");
    EXPECT_NE(_presentations.alert(), nullptr);
}

TEST_F(PresentationsTest, TouchTheButtonOfATitle) {
    present();
    static_cast<void>(takeCalls());

    ASSERT_TRUE(_presentations.touchButton("Now"));
    EXPECT_EQ(_presentations.usableButton()->titleForState(ControlState::normal), Text("Now"));

    EXPECT_EQ(takeCalls(), Calls{"touched"});
    EXPECT_EQ(_presentations.touchButton("Later").error(), "the button \"Later\" is disabled");
    EXPECT_EQ(_presentations.touchButton("Never").error(), "the screen has no button \"Never\"");
}

TEST_F(PresentationsTest, TouchNothingUnderAnAlert) {
    present();
    presentAlert();
    static_cast<void>(takeCalls());

    EXPECT_EQ(_presentations.touchButton("Now").error(), "an alert covers the screen");
    EXPECT_EQ(_presentations.touchButton("cancel").error(), "an alert covers the screen");
    EXPECT_EQ(_presentations.usableButton(), nullptr);
    EXPECT_EQ(takeCalls(), Calls());
}

TEST_F(PresentationsTest, TouchNothingUnderTheSignOfABusyPage) {
    present();
    _presentations.setBusy(true);
    static_cast<void>(takeCalls());

    EXPECT_EQ(_presentations.touchButton("Now").error(), "the page is busy");
    EXPECT_EQ(_presentations.touchButton("cancel").error(), "the page is busy");
    EXPECT_EQ(_presentations.usableButton(), nullptr);
    EXPECT_EQ(takeCalls(), Calls());

    _presentations.setBusy(false);
    EXPECT_TRUE(_presentations.touchButton("Now"));
}

TEST_F(PresentationsTest, TouchOnlyWhatCanBeSeenAndTakesTouches) {
    present();
    const auto button = _presentations.usableButton();
    static_cast<void>(takeCalls());

    button->setAlpha(0);
    EXPECT_EQ(_presentations.touchButton("Now").error(), "the button \"Now\" cannot be touched");
    button->setAlpha(1);
    button->setHidden(true);
    EXPECT_EQ(_presentations.touchButton("Now").error(), "the button \"Now\" cannot be touched");
    button->setHidden(false);
    button->setUserInteractionEnabled(false);
    EXPECT_EQ(_presentations.touchButton("Now").error(), "the button \"Now\" cannot be touched");
    EXPECT_EQ(_presentations.usableButton(), nullptr);
    EXPECT_EQ(takeCalls(), Calls());
}

TEST_F(PresentationsTest, TouchTheCancelButtonOfTheBar) {
    present();
    static_cast<void>(takeCalls());

    ASSERT_TRUE(_presentations.touchButton("cancel"));
    EXPECT_EQ(takeCalls(), Calls{"cancel"});

    _page->navigationItem().setLeftBarButtonItem(std::nullopt);
    EXPECT_EQ(_presentations.touchButton("cancel").error(),
              "the screen's bar has no cancel button");
}

TEST_F(PresentationsTest, LayOutAScreenThatAsksForIt) {
    present();
    static_cast<void>(takeCalls());

    _presentations.layOut();
    _presentations.layOut();
    EXPECT_EQ(takeCalls(), Calls{"lays out 0"});

    _presentations.layOut({.width = 320, .height = 480});
    _presentations.layOut({.width = 320, .height = 480});
    _presentations.layOut();
    EXPECT_EQ(takeCalls(), (Calls{"lays out 320", "lays out 320"}));
}

TEST(PresentedSheets, ASheetEndsWithWhatTheUserDid) {
    Presentations presentations;
    std::vector<ShareOutcome> outcomes;
    const auto sheet = std::make_shared<ShareSheet>(std::vector{FileURL("/a")});
    sheet->setCompletionWithItemsHandler([&](ShareOutcome outcome) {
        // It still stands.
        EXPECT_EQ(presentations.shareSheet(), sheet);
        outcomes.push_back(outcome);
        presentations.dismissLast();
    });
    presentations.present(sheet);

    EXPECT_TRUE(presentations.endSharing(ShareOutcome::failed));

    EXPECT_EQ(outcomes, std::vector{ShareOutcome::failed});
    EXPECT_EQ(presentations.shareSheet(), nullptr);
}

TEST(PresentedSheets, WithoutASheetNothingIsShared) {
    Presentations presentations;

    const auto ended = presentations.endSharing(ShareOutcome::sent);

    ASSERT_FALSE(ended);
    EXPECT_EQ(ended.error(), "no share sheet is presented");
}

TEST(PresentedSheets, ASheetWithoutAHandlerStaysUntilItIsDismissed) {
    Presentations presentations;
    const auto sheet = std::make_shared<ShareSheet>(std::vector{FileURL("/a")});
    presentations.present(sheet);
    presentations.present(std::make_shared<ShareSheet>(std::vector{FileURL("/b")}));
    EXPECT_EQ(presentations.shareSheet(), sheet);

    EXPECT_TRUE(presentations.endSharing(ShareOutcome::sent));
    EXPECT_EQ(presentations.shareSheet(), sheet);
    presentations.dismissLast();
    EXPECT_EQ(presentations.shareSheet(), nullptr);
    // There is nothing more.
    presentations.dismissLast();
}

TEST(PresentedSheets, AllIsTakenAway) {
    Presentations presentations;
    const auto sheet = std::make_shared<ShareSheet>(std::vector{FileURL("/a")});
    presentations.present(sheet);

    presentations.dismissAll();

    EXPECT_EQ(presentations.shareSheet(), nullptr);
    EXPECT_EQ(sheet.use_count(), 1);
}

TEST_F(PresentationsTest, ASheetOverAScreenGoesFirst) {
    present();
    _presentations.present(std::make_shared<ShareSheet>(std::vector<FileURL>()));

    _presentations.dismissLast();
    EXPECT_EQ(_presentations.shareSheet(), nullptr);
    EXPECT_NE(_presentations.screen(), nullptr);
    _presentations.dismissLast();

    EXPECT_EQ(_presentations.screen(), nullptr);
}

TEST_F(PresentationsTest, NoScreenComesOverASheet) {
    _presentations.present(std::make_shared<ShareSheet>(std::vector<FileURL>()));

    present();

    EXPECT_EQ(_presentations.screen(), nullptr);
}

} // namespace
} // namespace nimbra::host
