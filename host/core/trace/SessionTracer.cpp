#include "host/core/trace/SessionTracer.h"

#include "host/core/trace/Trace.h"
#include "platform/host/SettingsListController.h"

#include <string>
#include <utility>

namespace nimbra::host {

SessionTracer::SessionTracer(const PlatformServices& services, Trace& trace)
    : _services(services), _trace(trace), _presenter(services.presenter, trace),
      _accountStore(services.accountStore, trace),
      _documentContainers(services.documentContainers, trace),
      _notificationCenter(services.notificationCenter, "local", trace), _systemLog(trace),
      _table(trace), _parent(trace),
      _earlierSyslogSink(replaceSyslogSink([&trace](int priority, const std::string& message) {
          trace.write("syslog", {{"priority", priority}, {"message", message}});
      })) {}

SessionTracer::~SessionTracer() {
    replaceSyslogSink(std::move(_earlierSyslogSink));
}

PlatformServices SessionTracer::services() {
    return {.presenter = _presenter,
            .accountStore = _accountStore,
            .documentContainers = _documentContainers,
            .notificationCenter = _notificationCenter,
            .workQueues = _services.workQueues,
            .fileManager = _services.fileManager,
            .bundles = _services.bundles,
            .localization = _services.localization,
            .deviceInfo = _services.deviceInfo,
            .restrictions = _services.restrictions,
            .systemLog = _systemLog};
}

std::shared_ptr<Account> SessionTracer::traced(std::shared_ptr<Account> account) const {
    return _accountStore.traced(std::move(account));
}

void SessionTracer::observeList(SettingsListController& pane) {
    pane.setObserver(&_table);
}

void SessionTracer::observeRefreshControl(SettingsListController& pane) {
    if (const auto& control = pane.table().refreshControl()) {
        control->setEndObserver(
            [&trace = _trace] { trace.write("refreshControl", {{"op", "endRefreshing"}}); });
    }
}

void SessionTracer::observeParent(SettingsListController& parent) {
    parent.setObserver(&_parent);
}

} // namespace nimbra::host
