#include "device/documents/DeviceProgressReports.h"

#include "platform/system/WorkQueue.h"

#include <algorithm>
#include <iterator>
#include <list>
#include <string_view>
#include <utility>
#include <vector>

namespace nimbra::device {

namespace {

/// Whether `url` names `above` or a file below it.
bool isAtOrBelow(std::string_view url, std::string_view above) {
    while (above.ends_with('/')) {
        above.remove_suffix(1);
    }
    return url.starts_with(above) && (url.size() == above.size() || url[above.size()] == '/');
}

} // namespace

/// The token does not own its subscription: whoever keeps the token does not keep the handlers.
struct DeviceProgressReports::Subscription {
    struct Told {
        std::shared_ptr<ProgressReport> progress;
        UnpublishingHandler unpublishing;
    };

    std::string url;
    PublishingHandler handler;
    std::shared_ptr<ProgressSubscriber> token = std::make_shared<ProgressSubscriber>();
    /// What the handler was called with and has not ended yet.
    std::vector<Told> told;
    bool ended = false;
};

struct DeviceProgressReports::State : std::enable_shared_from_this<State> {
    struct Published {
        std::string url;
        std::shared_ptr<ProgressReport> progress;
    };

    explicit State(WorkQueue& queue) : mainQueue(queue) {}

    WorkQueue& mainQueue;
    std::function<void()> firstSubscription;
    std::list<std::shared_ptr<Subscription>> subscriptions;
    std::vector<Published> published;
    /// The handlers that are to be called for subscriptions that have ended.
    std::list<UnpublishingHandler> ending;
    bool finished = false;

    void publishSoon(const std::shared_ptr<Subscription>& subscription,
                     const std::shared_ptr<ProgressReport>& progress) {
        mainQueue.async([weakState = weak_from_this(),
                         weakSubscription = std::weak_ptr(subscription), progress] {
            const auto state = weakState.lock();
            const auto alive = weakSubscription.lock();
            if (state && alive && !alive->ended) {
                state->publishNow(*alive, progress);
            }
        });
    }

    void publishNow(Subscription& subscription, const std::shared_ptr<ProgressReport>& progress) {
        UnpublishingHandler unpublishing = subscription.handler(progress);
        // The handler may have ended the subscription, or everything.
        if (finished || !unpublishing) {
            return;
        }
        if (subscription.ended) {
            endSoon(std::move(unpublishing));
        } else {
            subscription.told.push_back({progress, std::move(unpublishing)});
        }
    }

    void unpublishSoon(const std::shared_ptr<Subscription>& subscription,
                       const std::shared_ptr<ProgressReport>& progress) {
        mainQueue.async([weakState = weak_from_this(),
                         weakSubscription = std::weak_ptr(subscription), progress] {
            const auto state = weakState.lock();
            const auto alive = weakSubscription.lock();
            if (!state || !alive) {
                return;
            }
            const auto told =
                std::ranges::find(alive->told, progress, &Subscription::Told::progress);
            if (told != alive->told.end()) {
                const UnpublishingHandler unpublishing = std::move(told->unpublishing);
                alive->told.erase(told);
                unpublishing();
            }
        });
    }

    void endSoon(UnpublishingHandler unpublishing) {
        ending.push_back(std::move(unpublishing));
        mainQueue.async([weakState = weak_from_this()] {
            const auto state = weakState.lock();
            if (state && !state->ending.empty()) {
                const UnpublishingHandler first = std::move(state->ending.front());
                state->ending.pop_front();
                first();
            }
        });
    }
};

DeviceProgressReports::DeviceProgressReports(WorkQueue& mainQueue)
    : _state(std::make_shared<State>(mainQueue)) {}

DeviceProgressReports::~DeviceProgressReports() {
    finish();
}

std::shared_ptr<ProgressSubscriber>
DeviceProgressReports::_addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                                     PublishingHandler handler) {
    const auto subscription = std::make_shared<Subscription>(url, std::move(handler));
    if (_state->finished) {
        return subscription->token;
    }
    _state->subscriptions.push_back(subscription);
    if (const auto firstSubscription = std::exchange(_state->firstSubscription, nullptr)) {
        firstSubscription();
    }
    for (const State::Published& published : _state->published) {
        if (isAtOrBelow(published.url, url)) {
            _state->publishSoon(subscription, published.progress);
        }
    }
    return subscription->token;
}

void DeviceProgressReports::_removeSubscriber(
    const std::shared_ptr<ProgressSubscriber>& subscriber) {
    const auto entry = std::ranges::find(_state->subscriptions, subscriber, &Subscription::token);
    if (entry == _state->subscriptions.end()) {
        return;
    }
    // Held to the end, as what its handlers captured may come back here when it goes.
    const auto subscription = std::move(*entry);
    _state->subscriptions.erase(entry);
    subscription->ended = true;
    for (Subscription::Told& told : std::exchange(subscription->told, {})) {
        _state->endSoon(std::move(told.unpublishing));
    }
}

void DeviceProgressReports::publish(const std::string& url,
                                    const std::shared_ptr<ProgressReport>& progress) {
    if (_state->finished) {
        return;
    }
    _state->published.push_back({url, progress});
    for (const auto& subscription : _state->subscriptions) {
        if (isAtOrBelow(url, subscription->url)) {
            _state->publishSoon(subscription, progress);
        }
    }
}

void DeviceProgressReports::unpublish(const std::shared_ptr<ProgressReport>& progress) {
    std::erase_if(_state->published,
                  [&progress](const auto& entry) { return entry.progress == progress; });
    for (const auto& subscription : _state->subscriptions) {
        _state->unpublishSoon(subscription, progress);
    }
}

void DeviceProgressReports::setFirstSubscriptionHandler(std::function<void()> handler) {
    _state->firstSubscription = std::move(handler);
}

void DeviceProgressReports::finish() {
    _state->finished = true;
    _state->firstSubscription = nullptr;
    // Emptied before they go: what a handler captured may come back here when it is destroyed.
    const auto subscriptions = std::exchange(_state->subscriptions, {});
    const auto published = std::exchange(_state->published, {});
    const auto ending = std::exchange(_state->ending, {});
    for (const auto& subscription : subscriptions) {
        subscription->ended = true;
        // A piece of work that is under way may still hold the subscription.
        const auto told = std::exchange(subscription->told, {});
    }
}

} // namespace nimbra::device
