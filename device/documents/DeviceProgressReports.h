#pragma once

#include "platform/documents/ProgressReports.h"

#include <functional>
#include <memory>
#include <string>

namespace nimbra {
class WorkQueue;
}

namespace nimbra::device {

/// The progress that is published on the device. Main queue only; every handler is called in a
/// piece of work of its own.
class DeviceProgressReports final : public ProgressReports {
public:
    /// `mainQueue` is not owned and outlives the reports.
    explicit DeviceProgressReports(WorkQueue& mainQueue);
    /// Lets the handlers go as `finish` does.
    ~DeviceProgressReports() override;

    /// A subscription gets the progress of the file that `url` names and of what is below it,
    /// whether a "/" stands at the end or not.
    [[nodiscard]] std::shared_ptr<ProgressSubscriber>
    _addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                  PublishingHandler handler) override;
    /// The handlers of progress that is still published are called soon. Work that waits to
    /// publish something to the subscriber is dropped.
    void _removeSubscriber(const std::shared_ptr<ProgressSubscriber>& subscriber) override;

    /// Publishes `progress` for the file that `url` names, until it is unpublished.
    void publish(const std::string& url, const std::shared_ptr<ProgressReport>& progress);
    void unpublish(const std::shared_ptr<ProgressReport>& progress);

    /// Calls `handler` once, within the first subscription, before anything is published to it.
    void setFirstSubscriptionHandler(std::function<void()> handler);

    /// Lets every handler go, uncalled, and takes none from here on: they hold views.
    void finish();

private:
    struct Subscription;
    struct State;

    /// What waits on the main queue holds it weakly: where it has gone, nothing is called.
    std::shared_ptr<State> _state;
};

} // namespace nimbra::device
