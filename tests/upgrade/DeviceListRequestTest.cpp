#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Label.h"
#include "tests/upgrade/UpgradeFixture.h"

#include <chrono>
#include <gmock/gmock.h>
#include <thread>

namespace nimbra::test {
namespace {

struct DeviceListRequestTest : UpgradeFixture {
    std::vector<ViewAnimation> animations;

    DeviceListRequestTest() {
        platform.viewAnimations.setObserver(
            [this](const ViewAnimation& animation) { animations.push_back(animation); });
    }

    [[nodiscard]] std::shared_ptr<Button> button() const {
        return screen->viewNamed<Button>("_upgradeButton");
    }
    [[nodiscard]] std::shared_ptr<Label> warning() const {
        return screen->viewNamed<Label>("_warningLabel");
    }
    [[nodiscard]] std::shared_ptr<ActivityIndicatorView> spinner() const {
        return screen->viewNamed<ActivityIndicatorView>("_spinner");
    }
    PumpedQueue& mainQueue() { return platform.workQueues.mainQueue(); }
};

const DeviceListResponse twoDevices{.incompatibleDeviceNames = std::vector<Text>{"Old"},
                                    .needUpgradeDeviceNames = std::vector<Text>{"New"}};

TEST_F(DeviceListRequestTest, LoadingTheViewAsksOnceForTheDevicesOfTheEntryRowsAccount) {
    screen->loadViewIfNeeded();
    screen->loadViewIfNeeded();

    EXPECT_THAT(platform.deviceListRequests.accounts, testing::ElementsAre(account));
    EXPECT_EQ(platform.deviceListRequests.handlers.size(), 1U);
    EXPECT_TRUE(spinner()->isAnimating());
}

TEST_F(DeviceListRequestTest, NothingAsksASecondTime) {
    showDevices(std::vector<Text>{"New"}, {});
    for (int pass = 0; pass < 5; ++pass) {
        screen->view()->setNeedsLayout();
        screen->layoutViewIfNeeded();
        screen->viewDidAppear(true);
        screen->viewDidDisappear(true);
        mainQueue().pump();
    }

    EXPECT_EQ(platform.deviceListRequests.accounts.size(), 1U);
    EXPECT_EQ(platform.deviceListRequests.handlers.size(), 0U);
}

TEST_F(DeviceListRequestTest, WithoutAnAccountStillAsks) {
    entry->setUserInfo({});

    screen->loadViewIfNeeded();

    EXPECT_THAT(platform.deviceListRequests.accounts, testing::ElementsAre(nullptr));
}

TEST_F(DeviceListRequestTest, WhileNoAnswerComesTheButtonCannotBeTouched) {
    screen->loadViewIfNeeded();
    mainQueue().pump();

    button()->touch();

    EXPECT_EQ(platform.presenter.alert, nullptr);
    EXPECT_FALSE(button()->isEnabled());
    EXPECT_EQ(button()->alpha(), 0);
    EXPECT_EQ(warning()->alpha(), 0);
    EXPECT_EQ(marked(*warning()->attributedText()), "*[header]*[none known][end]\n");
    EXPECT_TRUE(platform.workQueues.timers().empty()) << "nobody waits for a time to pass";
}

TEST_F(DeviceListRequestTest, TheAnswerChangesNoViewBeforeTheMainQueueRuns) {
    screen->loadViewIfNeeded();

    platform.deviceListRequests.answer(twoDevices);

    EXPECT_EQ(screen->_devicesThatCannotUpgrade, twoDevices.incompatibleDeviceNames);
    EXPECT_EQ(screen->_devicesThatNeedUpgrade, twoDevices.needUpgradeDeviceNames);
    EXPECT_TRUE(spinner()->isAnimating());
    EXPECT_EQ(mainQueue().pendingCount(), 1U);
}

TEST_F(DeviceListRequestTest, BothListsAreThereBeforeTheMainQueueIsTold) {
    screen->loadViewIfNeeded();
    std::vector<std::string> listsAtQueueing;
    mainQueue().whenQueued = [&] {
        const auto first = [](const std::optional<std::vector<Text>>& names) {
            return names ? names->at(0).string() : "absent";
        };
        listsAtQueueing.push_back(first(screen->_devicesThatCannotUpgrade) + ' ' +
                                  first(screen->_devicesThatNeedUpgrade));
    };

    platform.deviceListRequests.answer(twoDevices);

    EXPECT_THAT(listsAtQueueing, testing::ElementsAre("Old New"));
}

TEST_F(DeviceListRequestTest, TheWarningComesFirstAndIsRevealedInWorkOfItsOwn) {
    screen->loadViewIfNeeded();
    screen->layoutViewIfNeeded();
    platform.deviceListRequests.answer(twoDevices);

    mainQueue().pumpOne();

    EXPECT_FALSE(spinner()->isAnimating());
    EXPECT_EQ(marked(*warning()->attributedText()),
              "*[header]*[one other]*first(New)*[end]\n*first(Old)*[it cannot]");
    EXPECT_TRUE(screen->view()->needsLayout());
    EXPECT_EQ(warning()->alpha(), 0);
    EXPECT_FALSE(button()->isEnabled());
    EXPECT_EQ(mainQueue().pendingCount(), 1U);

    mainQueue().pumpOne();

    EXPECT_EQ(warning()->alpha(), 1);
    EXPECT_EQ(button()->alpha(), 1);
    EXPECT_TRUE(button()->isEnabled());
    EXPECT_EQ(mainQueue().pendingCount(), 0U);
}

TEST_F(DeviceListRequestTest, TheWarningAndTheButtonFadeInTogetherForHalfASecond) {
    showDevices({}, {});

    ASSERT_EQ(animations.size(), 1U);
    const ViewAnimation& fadeIn = animations.front();
    EXPECT_EQ(fadeIn.name, Text("FadeIn"));
    EXPECT_EQ(fadeIn.duration, std::chrono::milliseconds(500));
    ASSERT_EQ(fadeIn.changes.size(), 2U);
    EXPECT_EQ(fadeIn.changes[0].view, warning());
    EXPECT_EQ(fadeIn.changes[0].alpha, 1);
    EXPECT_EQ(fadeIn.changes[1].view, button());
    EXPECT_EQ(fadeIn.changes[1].alpha, 1);
}

TEST_F(DeviceListRequestTest, TheButtonIsEnabledWhenTheFadeHasBeenCommitted) {
    bool wasEnabled = true;
    platform.viewAnimations.setObserver(
        [&](const ViewAnimation& /*animation*/) { wasEnabled = button()->isEnabled(); });

    showDevices({}, {});

    EXPECT_FALSE(wasEnabled);
    EXPECT_TRUE(button()->isEnabled());
}

TEST_F(DeviceListRequestTest, AFailedRequestShowsThatNoDeviceIsKnownAndEnablesTheButton) {
    screen->loadViewIfNeeded();

    platform.deviceListRequests.answer(std::nullopt);
    mainQueue().pump();

    EXPECT_EQ(screen->_devicesThatCannotUpgrade, std::nullopt);
    EXPECT_EQ(screen->_devicesThatNeedUpgrade, std::nullopt);
    EXPECT_EQ(marked(*warning()->attributedText()), "*[header]*[none known][end]\n");
    EXPECT_TRUE(button()->isEnabled());
    EXPECT_TRUE(platform.systemLog.lines.empty());
    EXPECT_TRUE(syslog.lines.empty());
    EXPECT_TRUE(platform.calls.empty());
}

TEST_F(DeviceListRequestTest, AnAnswerWithoutListsReplacesWhatWasThere) {
    screen->loadViewIfNeeded();
    screen->_devicesThatNeedUpgrade = std::vector<Text>{"earlier"};
    screen->_devicesThatCannotUpgrade = std::vector<Text>{"earlier"};

    platform.deviceListRequests.answer(DeviceListResponse());

    EXPECT_EQ(screen->_devicesThatNeedUpgrade, std::nullopt);
    EXPECT_EQ(screen->_devicesThatCannotUpgrade, std::nullopt);
}

TEST_F(DeviceListRequestTest, ARequestUnderWayKeepsTheScreenAndNothingElse) {
    screen->loadViewIfNeeded();
    const std::weak_ptr<OpenScreen> weakScreen = screen;
    const std::weak_ptr<SetupController> weakSheet = sheet;
    const std::weak_ptr<RecordingDelegate> weakDelegate = delegate;
    screen.reset();
    sheet.reset();
    delegate.reset();

    EXPECT_FALSE(weakScreen.expired());
    EXPECT_TRUE(weakSheet.expired());
    EXPECT_TRUE(weakDelegate.expired());

    platform.deviceListRequests.answer(twoDevices);
    EXPECT_FALSE(weakScreen.expired());
    mainQueue().pumpOne();
    EXPECT_FALSE(weakScreen.expired());
    mainQueue().pumpOne();
    EXPECT_TRUE(weakScreen.expired());
}

TEST_F(DeviceListRequestTest, ARequestThatIsNeverAnsweredLeavesTheWayOut) {
    screen->loadViewIfNeeded();
    mainQueue().pump();

    screen->cancelButtonTapped({});

    ASSERT_EQ(delegate->ended.size(), 1U);
    EXPECT_EQ(delegate->ended.front().how, "cancel");
    EXPECT_TRUE(spinner()->isAnimating());
}

TEST_F(DeviceListRequestTest, TheAnswerMayComeOnAnyThread) {
    screen->loadViewIfNeeded();
    std::thread service([this] { platform.deviceListRequests.answer(twoDevices); });
    std::size_t ran = 0;
    while (ran < 2) {
        ran += mainQueue().pumpOne() ? 1U : 0U;
        std::this_thread::yield();
    }

    EXPECT_EQ(marked(*warning()->attributedText()),
              "*[header]*[one other]*first(New)*[end]\n*first(Old)*[it cannot]");
    service.join();
}

} // namespace
} // namespace nimbra::test
