#include "host/core/trace/TracingProgressReports.h"

#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

std::shared_ptr<ProgressSubscriber>
TracingProgressReports::_addSubscriberForFileURLWithPublishingHandler(const std::string& url,
                                                                      PublishingHandler handler) {
    _trace.write("progress",
                 {{"op", "_addSubscriberForFileURL:withPublishingHandler:"}, {"url", url}});
    return _reports._addSubscriberForFileURLWithPublishingHandler(url, std::move(handler));
}

void TracingProgressReports::_removeSubscriber(
    const std::shared_ptr<ProgressSubscriber>& subscriber) {
    _trace.write("progress", {{"op", "_removeSubscriber:"}});
    _reports._removeSubscriber(subscriber);
}

} // namespace nimbra::host
