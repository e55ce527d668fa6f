#pragma once

#include "host/core/trace/ParentTracer.h"
#include "host/core/trace/TableTracer.h"
#include "host/core/trace/TracingAccountStore.h"
#include "host/core/trace/TracingAppTerminator.h"
#include "host/core/trace/TracingBundles.h"
#include "host/core/trace/TracingDeviceListRequests.h"
#include "host/core/trace/TracingDistributedNotificationCenter.h"
#include "host/core/trace/TracingDocumentContainers.h"
#include "host/core/trace/TracingFileManager.h"
#include "host/core/trace/TracingNotificationCenter.h"
#include "host/core/trace/TracingPresenter.h"
#include "host/core/trace/TracingPrivacyConsentStore.h"
#include "host/core/trace/TracingProcesses.h"
#include "host/core/trace/TracingProgressReports.h"
#include "host/core/trace/TracingRootController.h"
#include "host/core/trace/TracingSystemLog.h"
#include "host/core/trace/TracingWorkQueues.h"
#include "platform/PlatformServices.h"
#include "platform/system/Syslog.h"

#include <memory>

namespace nimbra {
class SettingsListController;
class Specifier;
} // namespace nimbra

namespace nimbra::host {

class Trace;

/// Stands between a pane and everything that it talks to, and traces it; while it lives, lines for
/// `syslog` go to the trace as well, instead of to the system's. Main queue only.
class SessionTracer {
public:
    /// Traces what is asked of `services`. They and `trace` outlive the tracer; the tracer
    /// outlives every controller made over its own services.
    SessionTracer(const PlatformServices& services, Trace& trace);
    SessionTracer(const SessionTracer&) = delete;
    SessionTracer& operator=(const SessionTracer&) = delete;
    ~SessionTracer();

    /// The services to be handed to a pane.
    [[nodiscard]] PlatformServices services();

    /// A root controller for panes, whose tasks are traced.
    [[nodiscard]] std::shared_ptr<SettingsRootController> makeRootController() const;

    /// `account`, traced, for a pane that gets it from its host; null for null.
    [[nodiscard]] std::shared_ptr<Account> traced(std::shared_ptr<Account> account) const;

    /// Traces each change of a list that it is told of. Owned by the tracer.
    [[nodiscard]] SettingsListObserver& listObserver() { return _table; }
    /// Traces the end of a refresh of `pane`, whose view is loaded.
    void observeRefreshControl(SettingsListController& pane);
    /// Traces that `parent` is built anew.
    void observeParent(SettingsListController& parent);
    /// Traces that the link `row` is opened.
    void traceDetail(const Specifier& row);

private:
    PlatformServices _services;
    Trace& _trace;
    TracingPresenter _presenter;
    TracingAccountStore _accountStore;
    TracingDocumentContainers _documentContainers;
    TracingNotificationCenter _notificationCenter;
    TracingWorkQueues _workQueues;
    TracingPrivacyConsentStore _privacyConsentStore;
    TracingAppTerminator _appTerminator;
    TracingSystemLog _systemLog;
    TracingDistributedNotificationCenter _distributedNotificationCenter;
    TracingProgressReports _progressReports;
    TracingDeviceListRequests _deviceListRequests;
    TracingBundles _bundles;
    TracingFileManager _fileManager;
    TracingProcesses _processes;
    TableTracer _table;
    ParentTracer _parent;
    SyslogSink _earlierSyslogSink;
};

} // namespace nimbra::host
