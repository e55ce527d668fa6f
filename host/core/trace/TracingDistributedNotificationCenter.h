#pragma once

#include "host/core/trace/TracingNotificationCenter.h"
#include "platform/system/DistributedNotificationCenter.h"

#include <memory>
#include <utility>

namespace nimbra::host {

/// Traces who observes another distributed notification center.
class TracingDistributedNotificationCenter final : public DistributedNotificationCenter {
public:
    /// Neither is owned; both outlive this one.
    TracingDistributedNotificationCenter(DistributedNotificationCenter& center, Trace& trace)
        : _tracing(center, "distributed", trace) {}

    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) override {
        return _tracing.addObserverForName(name, std::move(observation));
    }
    void removeObserver(const std::shared_ptr<ObserverToken>& token) override {
        _tracing.removeObserver(token);
    }
    void postNotification(const Notification& notification) override {
        _tracing.postNotification(notification);
    }

private:
    TracingNotificationCenter _tracing;
};

} // namespace nimbra::host
