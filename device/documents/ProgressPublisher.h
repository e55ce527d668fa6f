#pragma once

#include "device/documents/ProgressValues.h"
#include "platform/values/Error.h"

#include <expected>
#include <memory>
#include <string>

namespace nimbra {
class WorkQueue;
}

namespace nimbra::device {

class DeviceProgressReports;

/// Publishes progress from any thread; subscribers are told on the main queue.
///
/// However fast changes come, at most one piece of work a progress waits on the main queue: the
/// changes that come meanwhile wait with it as one, with the last value of each key. Subscribers
/// see a progress first with the values it was published with, and its last ones before its end. A
/// progress that has ended before the main queue came to it is not shown at all.
class ProgressPublisher {
public:
    /// Neither is owned; both outlive the publisher.
    ProgressPublisher(WorkQueue& mainQueue, DeviceProgressReports& reports);
    ProgressPublisher(const ProgressPublisher&) = delete;
    ProgressPublisher& operator=(const ProgressPublisher&) = delete;
    /// On the main queue. What waits there is dropped.
    ~ProgressPublisher();

    /// Publishes a progress under the name `id` for the file that `url` names. An error where one
    /// of this name is published.
    [[nodiscard]] std::expected<void, Error> publish(const std::string& id, const std::string& url,
                                                     ProgressValues values);
    /// Changes the progress `id`, key by key. An error where it is not published.
    [[nodiscard]] std::expected<void, Error> update(const std::string& id,
                                                    const ProgressChanges& changes);
    /// Ends the progress `id`. An error where it is not published.
    [[nodiscard]] std::expected<void, Error> unpublish(const std::string& id);

private:
    struct State;
    std::shared_ptr<State> _state;
};

} // namespace nimbra::device
