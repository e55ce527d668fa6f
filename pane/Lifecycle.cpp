#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/AccountStore.h"
#include "platform/documents/DocumentContainers.h"
#include "platform/system/Bundles.h"
#include "platform/system/WorkQueues.h"
#include "support/RSPLocalizedString.h"

namespace nimbra {

std::shared_ptr<Bundle> RSPNimbraDriveViewController::_paneBundle() const {
    return services().bundles->bundleWithIdentifier(
        BundleIdentifier("com.vantrel.NimbraDriveSettings"));
}

Text RSPNimbraDriveViewController::_localizedString(const Text& key) const {
    return RSPLocalizedString(key, "Localizable", _paneBundle());
}

std::shared_ptr<Account> RSPNimbraDriveViewController::_vantrelAccount() {
    {
        const std::scoped_lock lock(_vantrelAccountMutex);
        if (_vantrelAccount_) {
            return _vantrelAccount_;
        }
    }
    _reloadVantrelAccount();
    const std::scoped_lock lock(_vantrelAccountMutex);
    return _vantrelAccount_;
}

void RSPNimbraDriveViewController::_reloadVantrelAccount() {
    const UserInfo& entry = specifier()->userInfo();
    _isFirstSetup = userInfoValue<bool>(entry, FirstSetupKey);
    std::shared_ptr<Account> account;
    if (_isFirstSetup) {
        account = userInfoValue<std::shared_ptr<Account>>(entry, AccountKey);
    } else if (const auto identifier = userInfoValue<Text>(entry, AccountIdentifierKey)) {
        account = accountStore().accountWithIdentifier(AccountIdentifier(identifier.string()));
    }
    const std::scoped_lock lock(_vantrelAccountMutex);
    _vantrelAccount_ = std::move(account);
}

void RSPNimbraDriveViewController::viewDidLoad() {
    AccountSettingsPane::viewDidLoad();
    navigationItem().setLeftBarButtonItem(std::nullopt);
    navigationItem().setRightBarButtonItem(std::nullopt);

    const auto refreshControl = std::make_shared<RefreshControl>();
    table()->setRefreshControl(refreshControl);
    refreshControl->addTargetActionForControlEvents(
        weak_from_this(),
        [this](const std::shared_ptr<RefreshControl>& sender) { _refresh(sender); },
        ControlEvent::valueChanged);
}

void RSPNimbraDriveViewController::_refresh(const std::shared_ptr<RefreshControl>& sender) {
    services().documentContainers->forceRefreshAllContainersWithCompletion(
        [&mainQueue = services().workQueues->mainQueue(), sender] {
            mainQueue.async([sender] { sender->endRefreshing(); });
        });
}

void RSPNimbraDriveViewController::viewDidAppear(bool animated) {
    AccountSettingsPane::viewDidAppear(animated);
    _uiApplicationDidBecomeActiveObserver = _observe(
        ApplicationDidBecomeActiveNotification, &RSPNimbraDriveViewController::reloadSpecifiers);
    _mrTidewaterIdentityTokenStatusObserver =
        _observe(TidewaterIdentityDidChangeNotification,
                 &RSPNimbraDriveViewController::_registerContainerPriorityHinting);
    _mrContainersListChangedNotification =
        _observe(MRContainerListDidChangeNotification,
                 &RSPNimbraDriveViewController::_registerContainerPriorityHinting);
    _registerContainerPriorityHinting();
}

/// Calls `handle` for each posting of `name`, at once, on the queue that posts. The pane is held
/// weakly: a registration never keeps a closed pane alive.
std::shared_ptr<ObserverToken>
RSPNimbraDriveViewController::_observe(const NotificationName& name,
                                       void (RSPNimbraDriveViewController::*handle)()) {
    return services().notificationCenter->addObserverForName(
        name, {.usingBlock = [weakPane = weak_from_this(), handle](const Notification&) {
            if (const auto pane =
                    std::static_pointer_cast<RSPNimbraDriveViewController>(weakPane.lock())) {
                ((*pane).*handle)();
            }
        }});
}

void RSPNimbraDriveViewController::viewDidDisappear(bool animated) {
    AccountSettingsPane::viewDidDisappear(animated);
    NotificationCenter& center = services().notificationCenter;
    center.removeObserver(_uiApplicationDidBecomeActiveObserver);
    center.removeObserver(_mrTidewaterIdentityTokenStatusObserver);
    center.removeObserver(_mrContainersListChangedNotification);
    _unregisterContainerPriorityHinting();
}

void RSPNimbraDriveViewController::upgradeViewControllerDidCancel(
    const std::shared_ptr<RSPUpgradeViewController>& /*screen*/) {
    dismissViewControllerAnimated(true);
}

void RSPNimbraDriveViewController::upgradeViewControllerDidSucceed(
    const std::shared_ptr<RSPUpgradeViewController>& /*screen*/) {
    if (const auto parent = parentController()) {
        parent->reloadSpecifiers();
    }
    dismissViewControllerAnimated(true);
    dismissAnimated(true);
}

} // namespace nimbra
