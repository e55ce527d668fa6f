#pragma once

#include "platform/system/NotificationCenter.h"

#include <list>
#include <memory>
#include <mutex>

namespace nimbra::device {

/// The notifications of one process. Any thread.
class DeviceNotificationCenter final : public NotificationCenter {
public:
    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) override;
    void removeObserver(const std::shared_ptr<ObserverToken>& token) override;
    /// Ends every registration there is.
    void removeAllObservers();
    void postNotification(const Notification& notification) override;
    /// The same; `held` is let go when every block has run or been dropped.
    void postNotification(const Notification& notification, const std::shared_ptr<void>& held);

private:
    struct Registration;

    std::mutex _mutex;
    std::list<std::shared_ptr<Registration>> _registrations;
};

} // namespace nimbra::device
