#include "host/core/PaneSession.h"

#include "device/DevicePlatform.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "device/store/DeviceAccountStore.h"
#include "device/system/DeviceSettings.h"
#include "device/system/DeviceWorkQueues.h"
#include "host/core/BundleSearch.h"
#include "host/core/trace/SessionTracer.h"
#include "platform/host/SettingsRootController.h"
#include "platform/system/ClassRegistry.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "platform/system/NotificationCenter.h"

#include <utility>

namespace nimbra::host {

std::expected<std::unique_ptr<PaneSession>, Error> PaneSession::start(Configuration configuration) {
    std::unique_ptr<PaneSession> session(new PaneSession(std::move(configuration)));
    auto device = device::DevicePlatform::open(
        session->_configuration.root, session->_loop,
        {.timeSource = session->_configuration.timeSource,
         .keepsLogToItself = session->_configuration.keepsLogToItself});
    if (!device) {
        return std::unexpected(device.error());
    }
    session->_device = std::move(*device);
    session->_loop.follow(session->_device->workQueues());
    ViewMetrics* const viewMetrics = session->_configuration.viewMetrics;
    session->_services.emplace(session->_device->servicesFor(
        {*session, viewMetrics != nullptr ? *viewMetrics : session->_fixedViewMetrics,
         session->_viewAnimations}));
    if (const auto& locale = session->_configuration.locale) {
        session->_device->settings().overrideLocale(*locale);
    }
    if (Trace* trace = session->_configuration.trace) {
        session->_tracer = std::make_unique<SessionTracer>(*session->_services, *trace);
    }
    session->_rootController = session->_tracer ? session->_tracer->makeRootController()
                                                : std::make_shared<SettingsRootController>();
    return session;
}

PaneSession::PaneSession(Configuration configuration)
    : _configuration(std::move(configuration)), _scope(_loop.label()),
      _listWatcher([this] { updateFootersSoon(); }) {
    _loop.setTurnObserver([this] {
        updateFooters();
        // What is presented has been laid out before the main queue goes on: an answer that comes
        // at once finds the screen as the user has seen it.
        _presentations.layOut();
    });
}

PaneSession::~PaneSession() {
    if (_device) {
        // First, or a flood of news would have to be told before the end.
        _device->stopListening();
        closePane();
        settle();
    }
    _loop.setTurnObserver([] {});
}

void PaneSession::settle() {
    _loop.runUntilIdle(_device->workQueues());
    layOut();
}

void PaneSession::runPending() {
    _loop.runPending();
    layOut();
}

bool PaneSession::isSettled() const {
    return _loop.isIdle(_device->workQueues());
}

void PaneSession::layOut() {
    if (_footers) {
        _footers->layOut(_listWidth);
    }
    _presentations.layOut();
}

void PaneSession::replaceTexts(std::map<std::string, std::string> texts) {
    _texts = std::move(texts);
    if (_bundle) {
        _bundle->replaceTable("Localizable", *_texts);
    }
}

std::expected<void, Error> PaneSession::openAccountPage(const PaneEntry& entry) {
    if (const auto loaded = loadBundle(); !loaded) {
        return loaded;
    }
    auto userInfo = userInfoFor(entry);
    if (!userInfo) {
        return std::unexpected(std::move(userInfo.error()));
    }
    const ControllerClass& paneClass = _bundle->principalClass();
    const PlatformServices services = servicesForPane();
    // The row that leads to the page is the host's, but it is called what the page calls itself.
    const Text title =
        _bundle->localizedStringForKeyValueTable("CLOUD_DRIVE", "Nimbra Drive", "Localizable");
    _accountPage = std::make_shared<AccountPage>(services, title, paneClass, std::move(*userInfo));
    return {};
}

std::expected<void, Error> PaneSession::openPane(const PaneEntry& entry) {
    if (auto opened = openAccountPage(entry); !opened) {
        return opened;
    }
    const PlatformServices services = servicesForPane();
    _pane = _bundle->principalClass().create(services);
    _pane->setSpecifier(_accountPage->entryRow());
    _pane->setParentController(_accountPage);
    _pane->setRootController(_rootController);
    if (_tracer) {
        _tracer->observeParent(*_accountPage);
        _listWatcher.setTracer(&_tracer->listObserver());
    }
    _pane->setObserver(&_listWatcher);
    _footers = std::make_unique<GroupFooters>(_device->classes(), services, _device->systemLog());
    _pane->loadViewIfNeeded();
    _pane->table()->setCellSource([this](const IndexPath& path) { return cellOfRow(path); });
    if (_tracer) {
        _tracer->observeRefreshControl(*_pane);
    }
    static_cast<void>(_pane->specifiers());
    updateFootersSoon();
    return {};
}

void PaneSession::closePane() {
    if (!_pane) {
        return;
    }
    if (_isShown) {
        disappear();
    }
    _detailPage.leave();
    _presentations.dismissAll();
    _pane->setObserver(nullptr);
    _footers.reset();
    _pane.reset();
    _accountPage.reset();
}

std::shared_ptr<TableCell> PaneSession::cellOfRow(const IndexPath& path) {
    const auto row = _pane ? _pane->specifierAtIndexPath(path) : nullptr;
    const bool isShown = row && (!_isRowShown || _isRowShown(*row));
    return isShown ? std::make_shared<TableCell>(*_services, Rect(), row->label()) : nullptr;
}

void PaneSession::appear() {
    _isShown = true;
    _footers->setShown(true);
    _footers->update(rows());
    _pane->viewDidAppear(true);
}

void PaneSession::disappear() {
    _isShown = false;
    _footers->setShown(false);
    _pane->viewDidDisappear(true);
}

void PaneSession::updateFootersSoon() {
    // A batch of changes is one change to what stands in the window. The work makes sure that the
    // main queue has a turn.
    if (!_areFootersBehind.exchange(true)) {
        _loop.async([] {});
    }
}

void PaneSession::updateFooters() {
    if (_areFootersBehind.exchange(false) && _footers) {
        _footers->update(rows());
    }
}

void PaneSession::pullToRefresh() {
    if (const auto& control = _pane->table()->refreshControl()) {
        control->pull();
    }
}

bool PaneSession::isRefreshing() {
    if (!_pane) {
        return false;
    }
    const auto& control = _pane->table()->refreshControl();
    return control && control->isRefreshing();
}

std::string PaneSession::paneTitle() const {
    return _accountPage->entryRow()->name().string();
}

const SpecifierArray& PaneSession::rows() {
    return _pane->specifiers();
}

std::expected<std::shared_ptr<Specifier>, RowRefusal> PaneSession::row(std::string_view name) {
    return findRow(rows(), name);
}

std::expected<void, RowRefusal> PaneSession::uncoverRows() {
    // A share sheet may stand beside the list.
    if (_presentations.alert() != nullptr || _presentations.screen()) {
        return std::unexpected(refusalOfCoveredPage());
    }
    _detailPage.leave();
    return {};
}

std::expected<void, RowRefusal> PaneSession::setRow(std::string_view name, bool isOn) {
    const auto found = row(name);
    return found ? setRow(*found, isOn) : std::unexpected(found.error());
}

std::expected<void, RowRefusal> PaneSession::setRow(const std::shared_ptr<Specifier>& row,
                                                    bool isOn) {
    if (auto uncovered = uncoverRows(); !uncovered) {
        return uncovered;
    }
    return turnSwitch(*row, isOn);
}

std::expected<void, RowRefusal> PaneSession::tapRow(std::string_view name) {
    const auto found = row(name);
    return found ? tapRow(*found) : std::unexpected(found.error());
}

std::expected<void, RowRefusal> PaneSession::tapRow(const std::shared_ptr<Specifier>& row) {
    if (auto uncovered = uncoverRows(); !uncovered) {
        return uncovered;
    }
    if (row->cellType() != LinkListCell) {
        return pressButton(*row);
    }
    if (auto refusal = refusalToTap(*row)) {
        return std::unexpected(std::move(*refusal));
    }
    openDetail(row);
    return {};
}

void PaneSession::openDetail(const std::shared_ptr<Specifier>& row) {
    if (_tracer) {
        _tracer->traceDetail(*row);
    }
    _detailPage.open(row, servicesForPane(), _pane);
}

void PaneSession::becomeActive() {
    post({.name = ApplicationDidBecomeActiveNotification});
}

void PaneSession::post(const Notification& notification) {
    _services->notificationCenter->postNotification(notification);
}

void PaneSession::postDistributed(const Notification& notification) {
    _services->distributedNotificationCenter->postNotification(notification);
}

void PaneSession::setListObserver(SettingsListObserver* observer) {
    _listWatcher.setNext(observer);
}

void PaneSession::setActivityObserver(std::function<void()> observer) {
    _activityObserver = std::move(observer);
}

void PaneSession::showActivityInProgress(const Text& message) {
    setActivity(message ? message : Text(""));
}

void PaneSession::hideActivityInProgress() {
    setActivity(Text());
}

void PaneSession::setActivity(Text activity) {
    _activity = std::move(activity);
    _presentations.setBusy(_activity.isPresent());
    if (_activityObserver) {
        _activityObserver();
    }
}

void PaneSession::reloadParentSpecifier() {
    // The pane may have been dismissed meanwhile, and its page with it.
    if (_accountPage) {
        _accountPage->reloadSpecifierAnimated(_accountPage->entryRow(), false);
    }
}

void PaneSession::reloadAllParentSpecifiers() {
    // The account's page is the only one above the pane.
    reloadParentSpecifier();
}

void PaneSession::presentController(const std::shared_ptr<SetupController>& controller,
                                    bool /*animated*/) {
    _presentations.present(controller);
}

void PaneSession::dismissPresentedController(bool /*animated*/) {
    _presentations.dismissLast();
}

void PaneSession::dismissController(const ViewController& controller, bool /*animated*/) {
    if (&controller == _pane.get()) {
        // Later, as the pane itself asks for it and is still at work.
        _loop.async([this] { closePane(); });
    } else if (&controller == _presentations.screen().get()) {
        _presentations.dismissScreen();
    } else if (&controller == _detailPage.page().get()) {
        // As with the pane; meanwhile another page may have come in its place.
        _loop.async([this, page = std::weak_ptr(_detailPage.page())] {
            if (!page.expired() && page.lock() == _detailPage.page()) {
                _detailPage.leave();
            }
        });
    }
}

void PaneSession::presentAlert(const std::shared_ptr<AlertController>& alert, bool /*animated*/) {
    if (_pane) {
        _presentations.present(alert);
    }
}

void PaneSession::showAccountAlert(const std::shared_ptr<AccountAlertView>& alert) {
    _presentations.present(alert);
}

void PaneSession::presentShareSheet(const std::shared_ptr<ShareSheet>& sheet, bool /*animated*/) {
    // A collection may end after its page was closed, with none to show a sheet over.
    if (_pane) {
        _presentations.present(sheet);
    }
}

std::expected<void, Error> PaneSession::loadBundle() {
    if (_bundle) {
        return {};
    }
    auto loaded = _device->bundles().load(
        _configuration.bundle.value_or(findPaneBundle(_configuration.root)));
    if (!loaded) {
        return std::unexpected(loaded.error());
    }
    _bundle = std::move(*loaded);
    if (_texts) {
        _bundle->replaceTable("Localizable", *_texts);
    }
    return {};
}

PlatformServices PaneSession::servicesForPane() {
    return _tracer ? _tracer->services() : *_services;
}

std::expected<UserInfo, Error> PaneSession::userInfoFor(const PaneEntry& entry) {
    UserInfo userInfo;
    if (entry.firstSetup) {
        userInfo.emplace(FirstSetupKey, *entry.firstSetup);
    }
    std::optional<std::string> identifier = entry.account;
    if (!identifier) {
        const auto known = _device->accountStore().accountIdentifiers();
        if (!known) {
            return std::unexpected(known.error());
        }
        if (known->empty()) {
            return userInfo;
        }
        identifier = known->front().string();
    }
    const std::shared_ptr<Account> account =
        _services->accountStore->accountWithIdentifier(AccountIdentifier(*identifier));
    if (account) {
        userInfo.emplace(AccountKey, _tracer ? _tracer->traced(account) : account);
    }
    // In first setup an account need not be in the store yet: the object alone stands for it.
    if (!entry.firstSetup.value_or(false)) {
        userInfo.emplace(AccountIdentifierKey, Text(*identifier));
    }
    return userInfo;
}

} // namespace nimbra::host
