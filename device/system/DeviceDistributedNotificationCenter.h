#pragma once

#include "device/files/DevicePaths.h"
#include "device/system/DeviceNotificationCenter.h"
#include "device/system/NotificationFolder.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "platform/system/SystemLog.h"

#include <chrono>
#include <memory>
#include <mutex>
#include <string_view>

namespace nimbra::device {

/// The notifications among the processes of one device. Any thread.
///
/// The first observation binds the process's socket and starts a thread that waits for the others'
/// postings; where that fails, the log is told once, and the process hears only its own. What comes
/// in and is no notification is told to the log and ignored. While the queues do not keep up, no
/// more is taken in: the posters wait, each as long as its patience.
class DeviceDistributedNotificationCenter final : public DistributedNotificationCenter {
public:
    /// A poster waits no longer than `patience` for processes that do not keep up, which then miss
    /// the posting. `log` outlives the center.
    DeviceDistributedNotificationCenter(
        const DevicePaths& paths, SystemLog& log,
        std::chrono::milliseconds patience = std::chrono::milliseconds(500));
    DeviceDistributedNotificationCenter(const DeviceDistributedNotificationCenter&) = delete;
    DeviceDistributedNotificationCenter&
    operator=(const DeviceDistributedNotificationCenter&) = delete;
    /// As `finish`.
    ~DeviceDistributedNotificationCenter() override;

    /// An observation without a queue has no place to run: the log is told, and it is not called.
    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) override;
    void removeObserver(const std::shared_ptr<ObserverToken>& token) override;
    /// When it returns, the blocks of this process are queued on their queues, and the other
    /// processes have the notification. One longer than 64 kB stays in this process, and the log
    /// is told.
    void postNotification(const Notification& notification) override;

    /// Ends all registrations, also those that are made later, and the thread; the blocks are let
    /// go on the calling thread. Not on a queue whose work waits for the caller.
    void finish();

private:
    class Receiver;

    void startReceiver();
    void deliver(std::string_view message, const std::shared_ptr<void>& held);

    const DevicePaths _paths;
    const NotificationFolder _folder;
    SystemLog& _log;
    const std::chrono::milliseconds _patience;
    DeviceNotificationCenter _observers;
    std::mutex _mutex;
    bool _hasStarted = false;
    bool _isFinished = false;
    std::unique_ptr<Receiver> _receiver;
};

} // namespace nimbra::device
