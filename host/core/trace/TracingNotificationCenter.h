#pragma once

#include "platform/system/NotificationCenter.h"

#include <memory>
#include <string>

namespace nimbra::host {

class Trace;

/// Traces who observes another notification center, from when to when.
class TracingNotificationCenter final : public NotificationCenter {
public:
    /// `name` is what the trace calls the center. `center` and `trace` are not owned and outlive
    /// this one.
    TracingNotificationCenter(NotificationCenter& center, std::string name, Trace& trace);

    [[nodiscard]] std::shared_ptr<ObserverToken>
    addObserverForName(const NotificationName& name, Observation observation) override;
    void removeObserver(const std::shared_ptr<ObserverToken>& token) override;
    void postNotification(const Notification& notification) override;

private:
    void write(const char* operation, const NotificationName& name);

    NotificationCenter& _center;
    std::string _name;
    Trace& _trace;
};

} // namespace nimbra::host
