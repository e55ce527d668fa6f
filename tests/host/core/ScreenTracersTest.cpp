#include "host/core/AccountPage.h"
#include "platform/host/AccountAlertView.h"
#include "platform/host/AlertController.h"
#include "platform/host/SetupController.h"
#include "platform/system/ClassRegistry.h"
#include "platform/views/View.h"
#include "tests/host/core/TracersFixture.h"

#include <chrono>
#include <memory>
#include <optional>

namespace nimbra::host {
namespace {

TEST_F(Tracers, TellWhoIsPresentedAndWhoIsDismissed) {
    const ControllerClass paneClass{.name = "Pane", .create = {}};
    const auto pane = std::make_shared<AccountPage>(_services, "Drive", paneClass, UserInfo());
    const auto screen = std::make_shared<AccountPage>(_services, "Up", paneClass, UserInfo());
    const auto sheet = std::make_shared<SetupController>(screen);
    sheet->setModalPresentationStyle(ModalPresentationStyle::formSheet);

    _services.presenter->presentController(sheet, true);
    _services.presenter->dismissPresentedController(true);
    _services.presenter->dismissController(*screen, true);
    _services.presenter->dismissController(*pane, false);

    EXPECT_EQ(_platform.calls, (Lines{"present controller, animated", "dismiss presented, animated",
                                      "dismiss itself, animated", "dismiss itself"}));
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"present","what":"upgrade","animated":true,"style":2})",
                     R"({"event":"dismiss","what":"upgrade","animated":true})",
                     R"({"event":"dismiss","what":"upgrade","animated":true})",
                     R"({"event":"dismiss","what":"pane","animated":false})"}));
}

TEST_F(Tracers, TellWhatAlertsAskAndSay) {
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        "Sure?", Text(), AlertControllerStyle::alert);
    alert->addAction(AlertAction::actionWithTitleStyleHandler("No", AlertActionStyle::cancel, {}));
    alert->addAction(
        AlertAction::actionWithTitleStyleHandler("Yes", AlertActionStyle::standard, {}));
    _services.presenter->presentAlert(alert, false);
    const auto accountAlert = std::make_shared<AccountAlertView>(
        _services, "Failed",
        AccountAlertView::Content{.message = "It did not work.", .buttonTitle = "OK"});
    accountAlert->show();

    EXPECT_EQ(_platform.calls, (Lines{"alert: Sure?", "account alert: Failed"}));
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"present","what":"alert","animated":false,"title":"Sure?",)"
                     R"("message":null,"actions":[{"title":"No","style":"cancel"},)"
                     R"({"title":"Yes","style":"default"}]})",
                     R"({"event":"present","what":"accountAlert","animated":true,)"
                     R"("title":"Failed","message":"It did not work.",)"
                     R"("actions":[{"title":"OK","style":"default"}]})"}));
}

TEST_F(Tracers, TellThatDevicesAreAskedForAndWhenTheAnswerComes) {
    const auto account =
        _services.accountStore->accountWithIdentifier(AccountIdentifier("primary"));
    static_cast<void>(takeLines());
    Lines order;
    const auto request = _services.deviceListRequests->initWithAccount(account);
    EXPECT_EQ(takeLines(), Lines());
    request->performRequestWithHandler(
        [&](const DeviceListRequest&, const std::optional<DeviceListResponse>& response) {
            EXPECT_FALSE(response);
            order = takeLines();
        });
    EXPECT_EQ(takeLines(), Lines{R"({"event":"deviceList","op":"request","account":"primary"})"});

    _platform.deviceListRequests.answer(std::nullopt);

    EXPECT_EQ(order, Lines{R"({"event":"deviceList","op":"response","account":"primary"})"});
    // The device gets its own account, which knows nothing of a trace.
    ASSERT_EQ(_platform.deviceListRequests.accounts.size(), 1U);
    EXPECT_NE(
        std::dynamic_pointer_cast<test::FakeAccount>(_platform.deviceListRequests.accounts.front()),
        nullptr);
}

TEST_F(Tracers, TellOfARequestWithoutAnAccount) {
    _services.deviceListRequests->initWithAccount(nullptr)->performRequestWithHandler(
        [](const DeviceListRequest&, const std::optional<DeviceListResponse>&) {});

    EXPECT_EQ(takeLines(), Lines{R"({"event":"deviceList","op":"request","account":null})"});
}

TEST_F(Tracers, TellThatAnAccountIsMarkedAndHowItIsSaved) {
    const auto account =
        _services.accountStore->accountWithIdentifier(AccountIdentifier("primary"));
    static_cast<void>(takeLines());
    account->vt_setUsesStratafile(true);
    bool isTold = false;
    _services.accountStore->saveAccount(
        account,
        {.doVerify = false, .completion = [&](const auto& saved) { isTold = saved.has_value(); }});
    ASSERT_EQ(_platform.accountStore.saves.size(), 1U);
    EXPECT_EQ(_platform.accountStore.saves.front().operation,
              "saveAccount, with completion, not verified");
    _platform.accountStore.endSave({});

    EXPECT_TRUE(isTold);
    EXPECT_TRUE(_platform.accountStore.stored.usesStratafile);
    const std::string operation = R"("op":"saveAccount:withDataclassActions:doVerify:completion:")";
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"account","op":"vt_setUsesStratafile:","account":"primary",)"
                     R"("dataclass":null,"value":true})",
                     R"({"event":"save","phase":"start","account":"primary",)" + operation + "}",
                     R"({"event":"save","phase":"end","account":"primary",)" + operation +
                         R"(,"success":true,"error":null})"}));
}

TEST_F(Tracers, TellOfASaveOfNoAccount) {
    bool isTold = false;
    _services.accountStore->saveAccount(
        nullptr, {.completion = [&](const auto& /*saved*/) { isTold = true; }});
    _platform.accountStore.saves.front().end(
        std::unexpected(Error{.domain = "d", .code = 1, .description = "none"}));

    EXPECT_TRUE(isTold);
    const std::string operation = R"("op":"saveAccount:withDataclassActions:doVerify:completion:")";
    EXPECT_EQ(takeLines(),
              (Lines{R"({"event":"save","phase":"start","account":null,)" + operation + "}",
                     R"({"event":"save","phase":"end","account":null,)" + operation +
                         R"(,"success":false,"error":{"domain":"d","code":1,)"
                         R"("description":"none"}})"}));
}

TEST_F(Tracers, TellWhatAnAnimationChanges) {
    const auto view = std::make_shared<View>(_services, Rect());
    view->setAccessibilityIdentifier("_label");
    view->setAlpha(0.5);
    _services.viewAnimations->beginAnimations("FadeOut");
    _services.viewAnimations->setAnimationDuration(std::chrono::milliseconds(250));
    view->setAlpha(0);
    EXPECT_EQ(takeLines(), Lines());
    _services.viewAnimations->commitAnimations();

    EXPECT_EQ(takeLines(), Lines{R"({"event":"animation","name":"FadeOut","duration":0.25,)"
                                 R"("changes":[{"view":"_label","alpha":0.0}]})"});
}

} // namespace
} // namespace nimbra::host
