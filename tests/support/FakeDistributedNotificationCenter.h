#pragma once

#include "platform/system/DistributedNotificationCenter.h"

#include <algorithm>
#include <memory>
#include <utility>
#include <vector>

namespace nimbra::test {

/// The notifications of a device with one process; a test sees who observes.
class FakeDistributedNotificationCenter final : public DistributedNotificationCenter {
public:
    struct Registration {
        std::shared_ptr<ObserverToken> token;
        NotificationName name;
        Observation observation;
    };

    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) override {
        registrations.push_back({std::make_shared<ObserverToken>(), name, std::move(observation)});
        return registrations.back().token;
    }

    void removeObserver(const std::shared_ptr<ObserverToken>& token) override {
        ++removals;
        std::erase_if(registrations, [&](const Registration& registration) {
            return registration.token == token;
        });
    }

    /// Queues `notification` for every observer of its name.
    void postNotification(const Notification& notification) override {
        for (const Registration& registration : registrations) {
            if (registration.name == notification.name) {
                registration.observation.queue->async([block = registration.observation.usingBlock,
                                                       notification] { block(notification); });
            }
        }
    }

    std::vector<Registration> registrations;
    /// How often a registration was to be ended.
    int removals = 0;
};

} // namespace nimbra::test
