#pragma once

#include "platform/values/ServiceReference.h"

namespace nimbra {

class AccountStore;
class AppTerminator;
class Applications;
class Bundles;
class ClassRegistry;
class Clock;
class DaemonConnection;
class DeviceInfo;
class DeviceListRequests;
class DistributedNotificationCenter;
class DocumentContainers;
class FileManager;
class LastSync;
class Localization;
class NotificationCenter;
class Preferences;
class Presenter;
class PrivacyConsentStore;
class Processes;
class ProgressReports;
class RestrictionsProfile;
class SystemLog;
class ViewAnimations;
class ViewMetrics;
class WorkQueues;

/// Everything that a pane reaches the platform through: handed to it when it is created. The host
/// and the device own the services, which outlive every controller made over them. A copy may be
/// given other services in the place of some.
struct PlatformServices {
    ServiceReference<Presenter> presenter;
    ServiceReference<AccountStore> accountStore;
    ServiceReference<DocumentContainers> documentContainers;
    ServiceReference<NotificationCenter> notificationCenter;
    ServiceReference<WorkQueues> workQueues;
    ServiceReference<FileManager> fileManager;
    ServiceReference<Bundles> bundles;
    /// The classes of the loaded bundles, to be looked up by name.
    ServiceReference<const ClassRegistry> classes;
    ServiceReference<Localization> localization;
    ServiceReference<DeviceInfo> deviceInfo;
    ServiceReference<RestrictionsProfile> restrictions;
    ServiceReference<PrivacyConsentStore> privacyConsentStore;
    ServiceReference<Applications> applications;
    ServiceReference<AppTerminator> appTerminator;
    ServiceReference<SystemLog> systemLog;
    ServiceReference<DistributedNotificationCenter> distributedNotificationCenter;
    ServiceReference<DaemonConnection> daemonConnection;
    ServiceReference<ProgressReports> progressReports;
    ServiceReference<LastSync> lastSync;
    ServiceReference<Clock> clock;
    ServiceReference<ViewMetrics> viewMetrics;
    ServiceReference<ViewAnimations> viewAnimations;
    ServiceReference<DeviceListRequests> deviceListRequests;
    ServiceReference<Preferences> preferences;
    ServiceReference<Processes> processes;
};

} // namespace nimbra
