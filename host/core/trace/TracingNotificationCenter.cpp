#include "host/core/trace/TracingNotificationCenter.h"

#include "host/core/trace/Trace.h"

#include <atomic>
#include <utility>

namespace nimbra::host {

namespace {

/// Stands for the registration with the traced center, and knows what it observes.
struct TracingToken final : ObserverToken {
    TracingToken(NotificationName observed, std::shared_ptr<ObserverToken> registered)
        : name(std::move(observed)), token(std::move(registered)) {}

    const NotificationName name;
    const std::shared_ptr<ObserverToken> token;
    std::atomic<bool> isRegistered = true;
};

} // namespace

TracingNotificationCenter::TracingNotificationCenter(NotificationCenter& center, std::string name,
                                                     Trace& trace)
    : _center(center), _name(std::move(name)), _trace(trace) {}

std::shared_ptr<ObserverToken>
TracingNotificationCenter::addObserverForName(const NotificationName& name,
                                              Observation observation) {
    write("add", name);
    return std::make_shared<TracingToken>(name,
                                          _center.addObserverForName(name, std::move(observation)));
}

void TracingNotificationCenter::removeObserver(const std::shared_ptr<ObserverToken>& token) {
    const auto registration = std::dynamic_pointer_cast<TracingToken>(token);
    if (registration && registration->isRegistered.exchange(false)) {
        write("remove", registration->name);
        _center.removeObserver(registration->token);
    }
}

void TracingNotificationCenter::postNotification(const Notification& notification) {
    _center.postNotification(notification);
}

void TracingNotificationCenter::write(const char* operation, const NotificationName& name) {
    _trace.write("observer", {{"op", operation}, {"center", _name}, {"name", name.string()}});
}

} // namespace nimbra::host
