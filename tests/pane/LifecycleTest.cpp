#include "tests/pane/PaneFixture.h"

#include <functional>

namespace nimbra::test {
namespace {

struct LifecycleTest : PaneFixture {
    /// Makes the pane anew, with `center` to observe with.
    void observeWith(NotificationCenter& center) {
        PlatformServices services = platform.services();
        services.notificationCenter = center;
        pane = std::make_shared<PaneWithRows>(services);
        pane->setSpecifier(entry);
    }
    void post(const NotificationName& name) {
        platform.notificationCenter.postNotification({.name = name});
    }
};

/// A parent page that counts how often it is rebuilt.
class CountingPage final : public SettingsListController {
public:
    using SettingsListController::SettingsListController;
    const SpecifierArray& specifiers() override {
        if (!_specifiers) {
            ++builds;
            _specifiers = SpecifierArray();
        }
        return *_specifiers;
    }
    int builds = 0;
};

/// Notes whose registrations are to be ended, and sees whether their tokens are still held.
class TokenCenter final : public NotificationCenter {
public:
    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& /*name*/, Observation /*observation*/) override {
        const auto token = std::make_shared<ObserverToken>();
        given.push_back(token);
        if (whenChanged) {
            whenChanged();
        }
        return token;
    }
    void removeObserver(const std::shared_ptr<ObserverToken>& token) override {
        removed.push_back(token.get());
        if (whenChanged) {
            whenChanged();
        }
    }
    void postNotification(const Notification& /*notification*/) override {}

    std::vector<std::weak_ptr<ObserverToken>> given;
    std::vector<const ObserverToken*> removed;
    /// Called when a registration begins or ends.
    std::function<void()> whenChanged;
};

TEST_F(LifecycleTest, TheAccountIsReadOnFirstUseAndKept) {
    EXPECT_EQ(platform.accountStore.asked, Calls());

    const auto account = pane->_vantrelAccount();

    EXPECT_EQ(account->identifier(), AccountIdentifier("primary"));
    EXPECT_EQ(pane->_vantrelAccount(), account);
    EXPECT_EQ(platform.accountStore.asked, Calls({"primary"}));
}

TEST_F(LifecycleTest, ReadingTheAccountAnewLosesWhatWasNotSaved) {
    storeTidewater(false);
    pane->turn(true);
    const auto edited = pane->_vantrelAccount();

    pane->_reloadVantrelAccount();

    EXPECT_NE(pane->_vantrelAccount(), edited);
    EXPECT_FALSE(pane->_vantrelAccount()->isEnabledForDataclass(kAccountDataclassTidewater));
}

TEST_F(LifecycleTest, InFirstSetupTheAccountIsTheOneHandedOver) {
    const auto handedOver = std::make_shared<FakeAccount>("new");
    entry->setUserInfo({{FirstSetupKey, true},
                        {AccountKey, std::static_pointer_cast<Account>(handedOver)},
                        {AccountIdentifierKey, Text("primary")}});

    static_cast<void>(pane->specifiers());
    pane->_reloadVantrelAccount();

    EXPECT_EQ(pane->_vantrelAccount(), handedOver);
    EXPECT_EQ(platform.accountStore.asked, Calls());
}

TEST_F(LifecycleTest, AFalseFirstSetupReadsTheStore) {
    entry->setUserInfo({{FirstSetupKey, false},
                        {AccountKey, std::shared_ptr<Account>(std::make_shared<FakeAccount>("x"))},
                        {AccountIdentifierKey, Text("primary")}});

    EXPECT_EQ(pane->_vantrelAccount()->identifier(), AccountIdentifier("primary"));
}

TEST_F(LifecycleTest, WithoutAnIdentifierNoStoreIsAsked) {
    entry->setUserInfo({});

    EXPECT_EQ(pane->_vantrelAccount(), nullptr);
    EXPECT_EQ(platform.accountStore.asked, Calls());
}

TEST_F(LifecycleTest, LoadingClearsTheBarAndInstallsTheRefreshControl) {
    pane->navigationItem().setLeftBarButtonItem(BarButtonItem{"Back"});
    pane->navigationItem().setRightBarButtonItem(BarButtonItem{"Edit"});

    pane->viewDidLoad();

    EXPECT_FALSE(pane->navigationItem().leftBarButtonItem());
    EXPECT_FALSE(pane->navigationItem().rightBarButtonItem());
    EXPECT_NE(pane->table()->refreshControl(), nullptr);
}

TEST_F(LifecycleTest, APullRefreshesAllContainersAndEndsOnTheMainQueue) {
    pane->viewDidLoad();
    const auto control = pane->table()->refreshControl();

    control->pull();
    ASSERT_EQ(platform.documentContainers.refreshes.size(), 1U);
    platform.documentContainers.refreshes.front()();
    EXPECT_TRUE(control->isRefreshing());
    platform.workQueues.mainQueue().pump();

    EXPECT_FALSE(control->isRefreshing());
    EXPECT_EQ(platform.calls, Calls());
}

TEST_F(LifecycleTest, ARefreshThatEndsAfterThePaneHasGoneDoesNoHarm) {
    pane->viewDidLoad();
    pane->table()->refreshControl()->pull();
    pane.reset();

    platform.documentContainers.refreshes.front()();
    platform.workQueues.mainQueue().pump();

    EXPECT_EQ(platform.workQueues.mainQueue().pendingCount(), 0U);
}

TEST_F(LifecycleTest, WhileShownTheListIsRebuiltWhenTheApplicationBecomesActive) {
    static_cast<void>(pane->specifiers());
    post(ApplicationDidBecomeActiveNotification);
    EXPECT_EQ(pane->appQueries, 1);

    pane->viewDidAppear(true);
    post(ApplicationDidBecomeActiveNotification);
    EXPECT_EQ(pane->appQueries, 2);

    pane->viewDidDisappear(true);
    post(ApplicationDidBecomeActiveNotification);
    EXPECT_EQ(pane->appQueries, 2);
}

TEST_F(LifecycleTest, AppearingAgainWithoutDisappearingKeepsTheEarlierRegistrations) {
    static_cast<void>(pane->specifiers());
    pane->viewDidAppear(true);
    pane->viewDidAppear(true);

    post(ApplicationDidBecomeActiveNotification);
    EXPECT_EQ(pane->appQueries, 3);

    // The tokens of the first appearance were replaced, so only the second's are removed.
    pane->viewDidDisappear(true);
    post(ApplicationDidBecomeActiveNotification);
    EXPECT_EQ(pane->appQueries, 4);
}

TEST_F(LifecycleTest, ARegisteredObserverDoesNotKeepThePaneAlive) {
    pane->viewDidAppear(true);
    const std::weak_ptr<PaneWithRows> watched = pane;

    pane.reset();

    EXPECT_TRUE(watched.expired());
    post(ApplicationDidBecomeActiveNotification);
    post(TidewaterIdentityDidChangeNotification);
    post(MRContainerListDidChangeNotification);
    platform.workQueues.queueLabelled("container-priority-hinting")->pump();
    EXPECT_EQ(platform.documentContainers.enumerations, 0);
}

TEST_F(LifecycleTest, CancelClosesOnlyTheUpgradeScreen) {
    const auto parent = std::make_shared<CountingPage>(platform.services());
    pane->setParentController(parent);

    pane->upgradeViewControllerDidCancel(nullptr);

    EXPECT_EQ(platform.calls, Calls({"dismiss presented, animated"}));
    EXPECT_EQ(parent->builds, 0);
}

TEST_F(LifecycleTest, SuccessReloadsTheParentThenClosesTheScreenThenThePane) {
    const auto parent = std::make_shared<CountingPage>(platform.services());
    RecordingListObserver parentObserver(platform.calls);
    parent->setObserver(&parentObserver);
    pane->setParentController(parent);

    pane->upgradeViewControllerDidSucceed(nullptr);

    EXPECT_EQ(platform.calls,
              Calls({"reload ", "dismiss presented, animated", "dismiss itself, animated"}));
}

TEST_F(LifecycleTest, SuccessWithoutAParentStillCloses) {
    pane->upgradeViewControllerDidSucceed(nullptr);

    EXPECT_EQ(platform.calls, Calls({"dismiss presented, animated", "dismiss itself, animated"}));
}

TEST_F(LifecycleTest, ThePaneThatGoesLetsItsRowsGo) {
    storeTidewater(true);
    fillAllRows();
    std::vector<std::weak_ptr<Specifier>> built;
    for (const auto& row : pane->specifiers()) {
        built.emplace_back(row);
    }
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);
    platform.workQueues.queueLabelled("container-priority-hinting")->pump();

    pane.reset();

    ASSERT_EQ(built.size(), 12U);
    for (const auto& row : built) {
        EXPECT_TRUE(row.expired());
    }
}

TEST_F(LifecycleTest, TheTokensStayInTheirFieldsUntilThePaneGoes) {
    TokenCenter center;
    observeWith(center);

    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);
    pane->viewDidDisappear(true);
    platform.workQueues.queueLabelled("container-priority-hinting")->pump();

    ASSERT_EQ(center.given.size(), 3U);
    std::vector<const ObserverToken*> twice;
    for (int time = 0; time < 2; ++time) {
        for (const auto& token : center.given) {
            ASSERT_FALSE(token.expired());
            twice.push_back(token.lock().get());
        }
    }
    EXPECT_EQ(center.removed, twice);

    pane.reset();
    for (const auto& token : center.given) {
        EXPECT_TRUE(token.expired());
    }
}

TEST_F(LifecycleTest, RegistrationsBeginAndEndBeforeTheHintingDoes) {
    TokenCenter center;
    observeWith(center);
    const auto hinting = [this] {
        return platform.workQueues.queueLabelled("container-priority-hinting");
    };
    int begun = 0;
    center.whenChanged = [&] {
        ++begun;
        EXPECT_EQ(hinting(), nullptr);
    };

    pane->viewDidAppear(true);

    EXPECT_EQ(begun, 3);
    ASSERT_NE(hinting(), nullptr);
    hinting()->pump();
    int ended = 0;
    center.whenChanged = [&] {
        ++ended;
        EXPECT_EQ(hinting()->pendingCount(), 0U);
    };

    pane->viewDidDisappear(true);

    EXPECT_EQ(ended, 3);
    EXPECT_GT(hinting()->pendingCount(), 0U);
}

TEST_F(LifecycleTest, ARefreshEndsOnTheControlThatWasPulled) {
    pane->viewDidLoad();
    const auto pulled = pane->table()->refreshControl();
    pulled->pull();
    const auto other = std::make_shared<RefreshControl>();
    pane->table()->setRefreshControl(other);
    other->pull();

    platform.documentContainers.refreshes.front()();
    platform.workQueues.mainQueue().pump();

    EXPECT_FALSE(pulled->isRefreshing());
    EXPECT_TRUE(other->isRefreshing());
}

TEST_F(LifecycleTest, ReadingTheAccountAnewLetsTheOldObjectGo) {
    const std::weak_ptr<Account> old = pane->_vantrelAccount();
    ASSERT_FALSE(old.expired());

    pane->_reloadVantrelAccount();

    EXPECT_TRUE(old.expired());
}

} // namespace
} // namespace nimbra::test
