#pragma once

#include "platform/documents/ProgressReport.h"

#include <functional>
#include <memory>
#include <string>

namespace nimbra {

/// Stands for one subscription. Letting it go does not end the subscription.
class ProgressSubscriber {
public:
    virtual ~ProgressSubscriber() = default;
};

/// The progress that is published for files on the device. Main queue only.
class ProgressReports {
public:
    using UnpublishingHandler = std::function<void()>;
    using PublishingHandler =
        std::function<UnpublishingHandler(const std::shared_ptr<ProgressReport>& progress)>;

    virtual ~ProgressReports() = default;

    /// Calls `handler` once for each progress published for `url`, or for a file below it: soon for
    /// those that are published already, then as they come. What it returns, which may be empty, is
    /// called once when that progress ends, also after the subscription has. Always on the main
    /// queue, and never within this call. The handlers are held until they cannot be called any
    /// more; those that are left are let go, uncalled, when the platform shuts down.
    [[nodiscard]] virtual std::shared_ptr<ProgressSubscriber>
    _addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                  PublishingHandler handler) = 0;

    /// Ends the subscription that `subscriber` stands for: no further progress is published to it.
    /// Those that were still have their end told.
    virtual void _removeSubscriber(const std::shared_ptr<ProgressSubscriber>& subscriber) = 0;
};

} // namespace nimbra
