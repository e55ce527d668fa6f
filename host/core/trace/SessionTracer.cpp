#include "host/core/trace/SessionTracer.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"
#include "host/core/trace/TracingAccount.h"
#include "platform/host/SettingsListController.h"
#include "platform/system/ClassRegistry.h"
#include "platform/views/ViewAnimations.h"

#include <string>
#include <utility>

namespace nimbra::host {

namespace {

void traceAnimation(const ViewAnimation& animation, Trace& trace) {
    auto changes = nlohmann::ordered_json::array();
    for (const ViewAnimation::Change& change : animation.changes) {
        changes.push_back(nlohmann::ordered_json{{"view", change.view->accessibilityIdentifier()},
                                                 {"alpha", change.alpha}});
    }
    trace.write("animation", {{"name", jsonOf(animation.name)},
                              {"duration", animation.duration.count()},
                              {"changes", std::move(changes)}});
}

} // namespace

SessionTracer::SessionTracer(const PlatformServices& services, Trace& trace)
    : _services(services), _trace(trace), _presenter(services.presenter, trace),
      _accountStore(services.accountStore, trace),
      _documentContainers(services.documentContainers, trace),
      _notificationCenter(services.notificationCenter, "local", trace),
      _workQueues(services.workQueues, trace),
      _privacyConsentStore(services.privacyConsentStore, trace),
      _appTerminator(services.appTerminator, trace), _systemLog(trace),
      _distributedNotificationCenter(services.distributedNotificationCenter, trace),
      _progressReports(services.progressReports, trace),
      _deviceListRequests(services.deviceListRequests, trace), _bundles(services.bundles, trace),
      _fileManager(services.fileManager, trace),
      _processes(services.processes, services.fileManager, trace), _table(trace), _parent(trace),
      _earlierSyslogSink(replaceSyslogSink([&trace](int priority, const std::string& message) {
          trace.write("syslog", {{"priority", priority}, {"message", message}});
      })) {
    services.viewAnimations->setObserver(
        [&trace](const ViewAnimation& animation) { traceAnimation(animation, trace); });
}

SessionTracer::~SessionTracer() {
    _services.viewAnimations->setObserver({});
    replaceSyslogSink(std::move(_earlierSyslogSink));
}

PlatformServices SessionTracer::services() {
    PlatformServices services = _services;
    services.presenter = _presenter;
    services.accountStore = _accountStore;
    services.documentContainers = _documentContainers;
    services.notificationCenter = _notificationCenter;
    services.privacyConsentStore = _privacyConsentStore;
    services.appTerminator = _appTerminator;
    services.systemLog = _systemLog;
    services.workQueues = _workQueues;
    services.distributedNotificationCenter = _distributedNotificationCenter;
    services.progressReports = _progressReports;
    services.deviceListRequests = _deviceListRequests;
    services.bundles = _bundles;
    services.fileManager = _fileManager;
    services.processes = _processes;
    return services;
}

std::shared_ptr<SettingsRootController> SessionTracer::makeRootController() const {
    return std::make_shared<TracingRootController>(_trace);
}

std::shared_ptr<Account> SessionTracer::traced(std::shared_ptr<Account> account) const {
    return _accountStore.traced(std::move(account));
}

void SessionTracer::observeRefreshControl(SettingsListController& pane) {
    if (const auto& control = pane.table()->refreshControl()) {
        control->setEndObserver(
            [&trace = _trace] { trace.write("refreshControl", {{"op", "endRefreshing"}}); });
    }
}

void SessionTracer::observeParent(SettingsListController& parent) {
    parent.setObserver(&_parent);
}

void SessionTracer::traceDetail(const Specifier& row) {
    const ControllerClass* pageClass = row.detailControllerClass();
    const auto account = userInfoValue<std::shared_ptr<Account>>(row.userInfo(), AccountKey);
    _trace.write("detail",
                 {{"class", jsonOf(pageClass != nullptr ? Text(pageClass->name) : Text())},
                  {"account", identifierOf(account)}});
}

} // namespace nimbra::host
