#include "device/system/DeviceNotificationCenter.h"

#include <algorithm>
#include <atomic>
#include <iterator>
#include <utility>
#include <vector>

namespace nimbra::device {

/// The token does not own its registration: whoever keeps the token does not keep the block.
struct DeviceNotificationCenter::Registration {
    NotificationName name;
    Observation observation;
    std::shared_ptr<ObserverToken> token = std::make_shared<ObserverToken>();
    std::atomic<bool> ended = false;

    [[nodiscard]] bool matches(const Notification& notification) const {
        return name == notification.name &&
               (observation.object == nullptr || observation.object == notification.object);
    }

    void call(const Notification& notification) const {
        if (!ended) {
            observation.usingBlock(notification);
        }
    }
};

std::shared_ptr<ObserverToken>
DeviceNotificationCenter::addObserverForName(const NotificationName& name,
                                             Observation observation) {
    const auto registration = std::make_shared<Registration>(name, std::move(observation));
    const std::scoped_lock lock(_mutex);
    _registrations.push_back(registration);
    return registration->token;
}

void DeviceNotificationCenter::removeObserver(const std::shared_ptr<ObserverToken>& token) {
    // Declared before the lock: what the block captured is destroyed without it.
    std::shared_ptr<Registration> removed;
    const std::scoped_lock lock(_mutex);
    const auto entry = std::ranges::find(_registrations, token, &Registration::token);
    if (entry != _registrations.end()) {
        removed = std::move(*entry);
        removed->ended = true;
        _registrations.erase(entry);
    }
}

void DeviceNotificationCenter::removeAllObservers() {
    // Declared before the lock, as above.
    std::list<std::shared_ptr<Registration>> removed;
    const std::scoped_lock lock(_mutex);
    removed.swap(_registrations);
    for (const auto& registration : removed) {
        registration->ended = true;
    }
}

void DeviceNotificationCenter::postNotification(const Notification& notification) {
    postNotification(notification, nullptr);
}

void DeviceNotificationCenter::postNotification(const Notification& notification,
                                                const std::shared_ptr<void>& held) {
    std::vector<std::shared_ptr<Registration>> matching;
    {
        const std::scoped_lock lock(_mutex);
        std::ranges::copy_if(_registrations, std::back_inserter(matching),
                             [&](const auto& entry) { return entry->matches(notification); });
    }
    for (const auto& registration : matching) {
        if (registration->observation.queue == nullptr) {
            registration->call(notification);
            continue;
        }
        registration->observation.queue->async(
            [weakRegistration = std::weak_ptr(registration), notification, held] {
                if (const auto alive = weakRegistration.lock()) {
                    alive->call(notification);
                }
            });
    }
}

} // namespace nimbra::device
