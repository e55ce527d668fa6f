#pragma once

#include "platform/documents/ProgressReports.h"

#include <memory>
#include <string>

namespace nimbra::host {

class Trace;

/// Traces who subscribes to the progress that others publish, from when to when.
class TracingProgressReports final : public ProgressReports {
public:
    /// Neither is owned; both outlive this one.
    TracingProgressReports(ProgressReports& reports, Trace& trace)
        : _reports(reports), _trace(trace) {}

    [[nodiscard]] std::shared_ptr<ProgressSubscriber>
    _addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                  PublishingHandler handler) override;
    void _removeSubscriber(const std::shared_ptr<ProgressSubscriber>& subscriber) override;

private:
    ProgressReports& _reports;
    Trace& _trace;
};

} // namespace nimbra::host
