#include "platform/host/AccountAlertView.h"
#include "platform/host/AlertController.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra {
namespace {

TEST(AlertControllerTest, AnAlertSaysWhatItWasMadeWith) {
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        "Title", "Message", AlertControllerStyle::alert);

    EXPECT_EQ(alert->title(), Text("Title"));
    EXPECT_EQ(alert->message(), Text("Message"));
    EXPECT_EQ(alert->preferredStyle(), AlertControllerStyle::alert);
    EXPECT_TRUE(alert->actions().empty());
}

TEST(AlertControllerTest, StylesHaveThePlatformsNumbers) {
    EXPECT_EQ(static_cast<int>(AlertControllerStyle::alert), 1);
    EXPECT_EQ(static_cast<int>(AlertActionStyle::standard), 0);
    EXPECT_EQ(static_cast<int>(AlertActionStyle::cancel), 1);
}

TEST(AlertControllerTest, AnswersStandInTheOrderInWhichTheyWereAdded) {
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        "Title", "Message", AlertControllerStyle::alert);
    int upgrades = 0;

    alert->addAction(
        AlertAction::actionWithTitleStyleHandler("Cancel", AlertActionStyle::cancel, nullptr));
    alert->addAction(AlertAction::actionWithTitleStyleHandler(
        "Continue", AlertActionStyle::standard, [&upgrades] { ++upgrades; }));

    ASSERT_EQ(alert->actions().size(), 2U);
    const AlertAction& cancel = alert->actions()[0];
    EXPECT_EQ(cancel.title, Text("Cancel"));
    EXPECT_EQ(cancel.style, AlertActionStyle::cancel);
    EXPECT_FALSE(cancel.handler);
    const AlertAction& proceed = alert->actions()[1];
    EXPECT_EQ(proceed.title, Text("Continue"));
    EXPECT_EQ(proceed.style, AlertActionStyle::standard);
    ASSERT_TRUE(proceed.handler);
    EXPECT_EQ(upgrades, 0);
    proceed.handler();
    EXPECT_EQ(upgrades, 1);
}

TEST(AccountAlertViewTest, AnAlertIsShownByTheHostAndDoesNothingBeforeItsButtonIsPressed) {
    test::TestPlatform platform;
    int presses = 0;
    const auto alert = std::make_shared<AccountAlertView>(
        platform.services(), "Failed",
        AccountAlertView::Content{
            .message = "Try later.", .buttonTitle = "OK", .action = [&presses] { ++presses; }});
    EXPECT_TRUE(platform.calls.empty());

    alert->show();

    EXPECT_EQ(platform.calls, std::vector<std::string>{"account alert: Failed"});
    ASSERT_EQ(platform.presenter.accountAlert, alert);
    EXPECT_EQ(alert->content().message, Text("Try later."));
    EXPECT_EQ(alert->content().buttonTitle, Text("OK"));
    EXPECT_EQ(presses, 0);
    alert->content().action();
    EXPECT_EQ(presses, 1);
}

} // namespace
} // namespace nimbra
