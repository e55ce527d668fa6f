#pragma once

#include "platform/documents/ProgressReports.h"

#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// Publishes at once what a test publishes; notes in `calls` who subscribes.
class FakeProgressReports final : public ProgressReports {
public:
    explicit FakeProgressReports(std::vector<std::string>& calls) : _calls(calls) {}

    [[nodiscard]] std::shared_ptr<ProgressSubscriber>
    _addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                  PublishingHandler handler) override {
        _calls.push_back("subscribe " + url);
        if (whenCalled) {
            whenCalled();
        }
        _subscriptions.push_back({std::make_shared<ProgressSubscriber>(), std::move(handler)});
        return _subscriptions.back().subscriber;
    }

    void _removeSubscriber(const std::shared_ptr<ProgressSubscriber>& subscriber) override {
        if (whenCalled) {
            whenCalled();
        }
        const auto ended = std::erase_if(_subscriptions, [&](const Subscription& subscription) {
            return subscription.subscriber == subscriber;
        });
        _calls.emplace_back(ended == 1 ? "unsubscribe" : "unsubscribe nobody");
    }

    /// Tells the newest subscriber of `progress`; what to call when the progress ends.
    UnpublishingHandler publish(const std::shared_ptr<ProgressReport>& progress) {
        return _subscriptions.at(_subscriptions.size() - 1).handler(progress);
    }

    [[nodiscard]] std::size_t subscriptionCount() const { return _subscriptions.size(); }

    /// Lets go of the handlers, as the platform does when it shuts down.
    void finish() { _subscriptions.clear(); }

    /// Called where somebody subscribes or ends a subscription, to see how things stand then.
    std::function<void()> whenCalled;

private:
    struct Subscription {
        std::shared_ptr<ProgressSubscriber> subscriber;
        PublishingHandler handler;
    };

    std::vector<Subscription> _subscriptions;
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
