#include "tests/upgrade/UpgradeFixture.h"

#include <gmock/gmock.h>
#include <thread>

namespace nimbra::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

struct UpgradeAction : UpgradeFixture {
    UpgradeAction() { showDevices({}, {}); }

    void touchButton() { screen->viewNamed<Button>("_upgradeButton")->touch(); }

    /// Answers the alert as a host does: it goes, then its action is called.
    void answer(std::size_t action) {
        const auto alert = std::exchange(platform.presenter.alert, nullptr);
        const auto handler = alert->actions().at(action).handler;
        if (handler) {
            handler();
        }
    }
    void pressOk() {
        const auto alert = std::exchange(platform.presenter.accountAlert, nullptr);
        alert->content().action();
    }
    void confirm() {
        touchButton();
        answer(1);
    }
    void endSave(const std::expected<void, Error>& saved) {
        platform.accountStore.endSave(saved);
        platform.workQueues.mainQueue().pump();
    }
    [[nodiscard]] std::vector<std::string> ends() const {
        std::vector<std::string> how;
        for (const auto& end : delegate->ended) {
            how.push_back(end.how);
        }
        return how;
    }
};

const std::unexpected failed{Error{.domain = "test", .code = 7, .description = "disk full"}};

TEST_F(UpgradeAction, TouchingTheButtonOnlyAsks) {
    touchButton();

    EXPECT_THAT(platform.calls, ElementsAre("alert, animated: Sure?"));
    const auto alert = platform.presenter.alert;
    EXPECT_EQ(platform.presenter.answersOfAlert, 2U) << "all of them, before it is shown";
    EXPECT_EQ(alert->message(), Text("No way back."));
    EXPECT_EQ(alert->preferredStyle(), AlertControllerStyle::alert);
    ASSERT_EQ(alert->actions().size(), 2U);
    EXPECT_EQ(alert->actions()[0].title, Text("Cancel"));
    EXPECT_EQ(alert->actions()[0].style, AlertActionStyle::cancel);
    EXPECT_FALSE(alert->actions()[0].handler);
    EXPECT_EQ(alert->actions()[1].title, Text("Continue"));
    EXPECT_EQ(alert->actions()[1].style, AlertActionStyle::standard);
    EXPECT_THAT(account->changes, IsEmpty());
    EXPECT_THAT(platform.accountStore.saves, IsEmpty());
}

TEST_F(UpgradeAction, CancellingTheQuestionChangesNothing) {
    touchButton();
    answer(0);
    platform.workQueues.mainQueue().pump();

    EXPECT_THAT(account->changes, IsEmpty());
    EXPECT_THAT(platform.accountStore.saves, IsEmpty());
    EXPECT_THAT(platform.systemLog.lines, IsEmpty());
    EXPECT_THAT(ends(), IsEmpty());
    EXPECT_TRUE(screen->viewNamed<Button>("_upgradeButton")->isEnabled());
    EXPECT_THAT(platform.calls, ElementsAre("alert, animated: Sure?"));
}

TEST_F(UpgradeAction, ContinuingMarksTheAccountAndSavesItUnverified) {
    confirm();

    EXPECT_THAT(account->changes,
                ElementsAre("uses stratafile: yes", "enable kAccountDataclassTidewater",
                            "enable kAccountDataclassTSYDatabaseService",
                            "enable kAccountDataclassTSYDeviceService",
                            "enable kAccountDataclassTSYShareService"));
    ASSERT_EQ(platform.accountStore.saves.size(), 1U);
    EXPECT_EQ(platform.accountStore.saves.front().operation,
              "saveAccount, with completion, not verified");
    EXPECT_EQ(platform.accountStore.saves.front().account, account);
    ASSERT_EQ(platform.accountStore.given.size(), 1U);
    EXPECT_TRUE(
        platform.accountStore.given.front().enabled.contains(kAccountDataclassTSYShareService))
        << "saved with all that has changed";
    EXPECT_THAT(platform.calls, ElementsAre("alert, animated: Sure?", "busy: Upgrading"));
}

TEST_F(UpgradeAction, TheLogSaysWhatIsDoneBeforeItIsDone) {
    std::vector<std::string> changesAtLine;
    platform.systemLog.onWrite = [&] {
        changesAtLine.push_back(std::to_string(account->changes.size()) + " changes, " +
                                std::to_string(platform.accountStore.saves.size()) + " saves, " +
                                platform.calls.back());
    };

    confirm();

    EXPECT_THAT(
        platform.systemLog.lines,
        ElementsAre(Pair(LogLevel::standard, "Marking account as using Nimbra Drive"),
                    Pair(LogLevel::standard, "Enabling Tidewater and all TSY dataclasses...")));
    EXPECT_THAT(changesAtLine, ElementsAre("0 changes, 0 saves, busy: Upgrading",
                                           "1 changes, 0 saves, busy: Upgrading"));
}

TEST_F(UpgradeAction, ASaveThatSucceedsTellsTheDelegateAndNobodyElse) {
    confirm();
    platform.calls.clear();

    endSave({});

    EXPECT_THAT(ends(), ElementsAre("success"));
    EXPECT_EQ(delegate->ended.front().screen.lock(), screen);
    EXPECT_THAT(platform.calls, ElementsAre("not busy"));
}

TEST_F(UpgradeAction, WithoutADelegateTheScreenReloadsItsParentAndGoes) {
    screen->setDelegate({});
    confirm();
    platform.calls.clear();

    endSave({});

    EXPECT_THAT(platform.calls,
                ElementsAre("not busy", "reload parent's rows", "dismiss itself, animated"));
    EXPECT_EQ(platform.presenter.dismissed, screen.get());
}

TEST_F(UpgradeAction, TheEndOfTheSaveIsHandledOnTheMainQueueOnly) {
    confirm();
    platform.calls.clear();

    platform.accountStore.endSave({});

    EXPECT_THAT(platform.calls, IsEmpty());
    EXPECT_THAT(ends(), IsEmpty());
    EXPECT_EQ(platform.workQueues.mainQueue().pendingCount(), 1U);
}

TEST_F(UpgradeAction, AFailedSaveShowsAnAlertThatDoesNotSayWhy) {
    confirm();
    platform.calls.clear();

    endSave(failed);

    EXPECT_THAT(platform.calls, ElementsAre("not busy", "account alert: Failed"));
    EXPECT_EQ(platform.presenter.accountAlert->content().message, Text("It did not work."));
    EXPECT_EQ(platform.presenter.accountAlert->content().buttonTitle, Text("OK"));
    EXPECT_THAT(ends(), IsEmpty());
    EXPECT_EQ(platform.systemLog.lines.size(), 2U);
}

TEST_F(UpgradeAction, AFailedSaveIsNotTriedAgain) {
    confirm();

    endSave(failed);
    EXPECT_THAT(platform.accountStore.saves, IsEmpty());
    pressOk();

    EXPECT_THAT(platform.accountStore.saves, IsEmpty());
}

TEST_F(UpgradeAction, LooksTheTextsOfItsAlertsUpFromTopToBottom) {
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(std::map<std::string, Text>());
    syslog.lines.clear();
    confirm();
    endSave(failed);

    EXPECT_THAT(missingKeys(),
                ElementsAre("CLOUD_DRIVE_ALERT_TITLE", "CLOUD_DRIVE_ALERT_MESSAGE", "CANCEL",
                            "CONTINUE", "UPGRADING_TO_CLOUD_DRIVE", "FAILED_MIGRATION_CLOUD_DRIVE",
                            "FAILED_MIGRATION_CLOUD_DRIVE_DESCRIPTION", "OK"));
}

TEST_F(UpgradeAction, WhatWaitsOnTheMainQueueDoesNotKeepTheDelegate) {
    confirm();
    platform.accountStore.endSave({});
    platform.calls.clear();
    const std::weak_ptr<RecordingDelegate> weakDelegate = delegate;

    delegate.reset();
    EXPECT_TRUE(weakDelegate.expired());
    platform.workQueues.mainQueue().pump();

    EXPECT_THAT(platform.calls,
                ElementsAre("not busy", "reload parent's rows", "dismiss itself, animated"));
}

TEST_F(UpgradeAction, AFailedSaveTakesNothingBack) {
    confirm();
    const auto changes = account->changes;

    endSave(failed);
    pressOk();

    EXPECT_EQ(account->changes, changes);
    EXPECT_EQ(account->reloads, 0);
}

TEST_F(UpgradeAction, AFailedSaveIsToldToTheDelegateAsACancelWhenTheUserHasSeenIt) {
    confirm();
    endSave(failed);
    platform.calls.clear();

    pressOk();

    EXPECT_THAT(ends(), ElementsAre("cancel"));
    EXPECT_EQ(delegate->ended.front().screen.lock(), screen);
    EXPECT_THAT(platform.calls, IsEmpty());
}

TEST_F(UpgradeAction, WithoutADelegateTheFailedScreenGoesByItself) {
    screen->setDelegate({});
    confirm();
    endSave(failed);
    platform.calls.clear();

    pressOk();

    EXPECT_THAT(platform.calls, ElementsAre("dismiss itself, animated"));
}

TEST_F(UpgradeAction, CancellingTheScreenSavesNothing) {
    screen->cancelButtonTapped({});

    EXPECT_THAT(ends(), ElementsAre("cancel"));
    EXPECT_THAT(account->changes, IsEmpty());
    EXPECT_THAT(platform.accountStore.saves, IsEmpty());
    EXPECT_THAT(platform.calls, IsEmpty());
}

TEST_F(UpgradeAction, WithoutADelegateCancellingDismissesTheScreen) {
    screen->setDelegate({});

    screen->cancelButtonTapped({});

    EXPECT_THAT(platform.calls, ElementsAre("dismiss itself, animated"));
}

TEST_F(UpgradeAction, WithoutAnAccountTheSaveFailsLikeAnyOther) {
    entry->setUserInfo({});
    confirm();

    ASSERT_EQ(platform.accountStore.saves.size(), 1U);
    EXPECT_EQ(platform.accountStore.saves.front().account, nullptr);
    EXPECT_EQ(platform.systemLog.lines.size(), 2U);
    endSave(failed);
    EXPECT_NE(platform.presenter.accountAlert, nullptr);
}

TEST_F(UpgradeAction, AnOpenQuestionKeepsTheScreen) {
    touchButton();
    const std::weak_ptr<OpenScreen> weakScreen = screen;
    screen.reset();
    sheet.reset();

    EXPECT_FALSE(weakScreen.expired());
    answer(1);
    EXPECT_THAT(account->changes, testing::SizeIs(5));
}

TEST_F(UpgradeAction, ASaveUnderWayKeepsTheScreenAndTheAccountButNotTheDelegate) {
    confirm();
    const std::weak_ptr<OpenScreen> weakScreen = screen;
    const std::weak_ptr<FakeAccount> weakAccount = account;
    const std::weak_ptr<RecordingDelegate> weakDelegate = delegate;
    screen.reset();
    sheet.reset();
    account.reset();
    entry.reset();
    delegate.reset();
    platform.deviceListRequests.accounts.clear();
    platform.calls.clear();

    EXPECT_FALSE(weakScreen.expired());
    EXPECT_FALSE(weakAccount.expired());
    EXPECT_TRUE(weakDelegate.expired());

    // Nobody is left to be told: the screen goes the way of one without a delegate. Its sheet has
    // gone, and with it the way to the parent.
    endSave({});
    EXPECT_THAT(platform.calls, ElementsAre("not busy", "dismiss itself, animated"));
    EXPECT_TRUE(weakScreen.expired());
    EXPECT_TRUE(weakAccount.expired());
}

TEST_F(UpgradeAction, AFailureAlertKeepsTheScreenUntilItIsAnswered) {
    confirm();
    const std::weak_ptr<OpenScreen> weakScreen = screen;
    endSave(failed);
    screen.reset();
    sheet.reset();

    EXPECT_FALSE(weakScreen.expired());
    pressOk();
    EXPECT_THAT(ends(), ElementsAre("cancel"));
    EXPECT_TRUE(weakScreen.expired());
}

TEST_F(UpgradeAction, ContinuingEnablesAlsoWhatIsEnabledAlready) {
    account->flags.enabled = {kAccountDataclassTidewater, kAccountDataclassTSYShareService};

    confirm();

    EXPECT_THAT(account->changes,
                ElementsAre("uses stratafile: yes", "enable kAccountDataclassTidewater",
                            "enable kAccountDataclassTSYDatabaseService",
                            "enable kAccountDataclassTSYDeviceService",
                            "enable kAccountDataclassTSYShareService"));
}

TEST_F(UpgradeAction, LooksTheBundleUpForEachTextOfItsAlert) {
    auto changed = texts();
    changed["CLOUD_DRIVE_ALERT_TITLE"] = "Really?";
    changed["CLOUD_DRIVE_ALERT_MESSAGE"] = "Think twice.";
    changed["CANCEL"] = "No";
    changed["CONTINUE"] = "Yes";
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(changed);
    const int before = platform.bundles.lookups;

    touchButton();

    EXPECT_EQ(platform.bundles.lookups - before, 4);
    const auto alert = platform.presenter.alert;
    EXPECT_EQ(alert->title(), Text("Really?"));
    EXPECT_EQ(alert->message(), Text("Think twice."));
    EXPECT_EQ(alert->actions().at(0).title, Text("No"));
    EXPECT_EQ(alert->actions().at(1).title, Text("Yes"));
}

TEST_F(UpgradeAction, TheSaveMayEndOnAnyThread) {
    confirm();
    std::thread store([this] { platform.accountStore.endSave({}); });
    while (!platform.workQueues.mainQueue().pumpOne()) {
        std::this_thread::yield();
    }
    store.join();

    EXPECT_THAT(ends(), ElementsAre("success"));
}

} // namespace
} // namespace nimbra::test
