#pragma once

#include "platform/PlatformServices.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <memory>
#include <string>

namespace nimbra {
class ClassRegistry;
class DaemonConnection;
class SystemLog;
class WorkQueue;
} // namespace nimbra

namespace nimbra::device {

class DeviceAccountStore;
class DeviceBundles;
class DeviceFileManager;
class DevicePrivacyConsentStore;
class DeviceProcesses;
class DeviceSettings;
class DeviceWorkQueues;
class ProgressPublisher;
class TimeSource;

/// Every service of the platform on one device directory: made, wired and ended together.
/// Main queue only; the services say for themselves where they may be used.
class DevicePlatform {
public:
    struct Options {
        /// What the clock and the timers run by; null for the machine's own time.
        std::shared_ptr<TimeSource> timeSource;
        /// Whether the log stays on the device: neither the machine's journal nor standard error
        /// is told anything.
        bool keepsLogToItself = false;
    };

    /// The platform of the device in `root`, whose main queue is `mainQueue` (not owned, outlives
    /// the platform). A directory that lacks something or holds something unreadable is an error
    /// that names the file and the place; nothing in it is changed.
    [[nodiscard]] static std::expected<std::unique_ptr<DevicePlatform>, Error>
    open(const std::filesystem::path& root, WorkQueue& mainQueue, Options options);

    DevicePlatform(const DevicePlatform&) = delete;
    DevicePlatform& operator=(const DevicePlatform&) = delete;
    /// Ends the progress that is followed, the distributed notifications, the requests that wait
    /// for an answer, the waiting for programs that run and the timers, lets their handlers go,
    /// waits for the background work under way, then ends the platform's threads.
    /// Every controller made over the services has gone before, but for what those handlers hold.
    ~DevicePlatform();

    /// What a host gives a pane beside the device's own services. All belong to the host, are
    /// called on the main queue only and outlive the pane, as the platform does.
    struct HostServices {
        Presenter& presenter;
        ViewMetrics& viewMetrics;
        ViewAnimations& viewAnimations;
    };
    /// The services for one pane.
    [[nodiscard]] PlatformServices servicesFor(const HostServices& host);

    /// From here on nothing comes from elsewhere: no progress, no notification, no answer of an
    /// account's service and no end of a program that runs, which is asked to end. What has come
    /// and has not been told yet is dropped.
    void stopListening();

    // What a host needs of the device beyond what a pane may ask.

    [[nodiscard]] DeviceAccountStore& accountStore();
    [[nodiscard]] DeviceBundles& bundles();
    [[nodiscard]] DevicePrivacyConsentStore& privacyConsentStore();
    [[nodiscard]] DeviceFileManager& fileManager();
    [[nodiscard]] DeviceProcesses& processes();
    [[nodiscard]] const DaemonConnection& daemonConnection() const;
    [[nodiscard]] ProgressPublisher& progressPublisher();
    [[nodiscard]] DeviceSettings& settings();
    [[nodiscard]] DeviceWorkQueues& workQueues();
    [[nodiscard]] ClassRegistry& classes();
    [[nodiscard]] SystemLog& systemLog();

private:
    struct Databases;
    struct Parts;
    explicit DevicePlatform(std::unique_ptr<Parts> parts);

    std::unique_ptr<Parts> _parts;
};

} // namespace nimbra::device
