#pragma once

namespace nimbra {

class AccountStore;
class Bundles;
class DeviceInfo;
class DocumentContainers;
class FileManager;
class Localization;
class NotificationCenter;
class Presenter;
class RestrictionsProfile;
class SystemLog;
class WorkQueues;

/// Everything that a pane reaches the platform through: handed to it when it is created. The host
/// and the device own the services, which outlive every controller made over them.
struct PlatformServices {
    Presenter& presenter;
    AccountStore& accountStore;
    DocumentContainers& documentContainers;
    NotificationCenter& notificationCenter;
    WorkQueues& workQueues;
    FileManager& fileManager;
    Bundles& bundles;
    Localization& localization;
    DeviceInfo& deviceInfo;
    RestrictionsProfile& restrictions;
    SystemLog& systemLog;
};

} // namespace nimbra
