#include "device/documents/DeviceDocumentContainers.h"

#include "device/documents/DeviceDocumentContainer.h"
#include "platform/system/SystemLog.h"
#include "platform/system/WorkQueue.h"

#include <utility>

namespace nimbra::device {

DeviceDocumentContainers::DeviceDocumentContainers(const DevicePaths& paths,
                                                   std::shared_ptr<WorkQueue> refreshQueue,
                                                   SystemLog& log)
    : _documents(paths, log), _hints(paths), _refreshQueue(std::move(refreshQueue)), _log(log) {}

DeviceDocumentContainers::~DeviceDocumentContainers() {
    // A hint that stays is one of a process that has gone, which the daemon ignores.
    static_cast<void>(_hints.removeAll());
}

std::vector<std::shared_ptr<DocumentContainer>> DeviceDocumentContainers::allContainers() {
    std::vector<std::shared_ptr<DocumentContainer>> containers;
    const auto description = _documents.read();
    if (description && description->identity) {
        for (const DeviceDescription::Container& container : description->containers) {
            containers.push_back(std::make_shared<DeviceDocumentContainer>(container, _hints));
        }
    }
    return containers;
}

void DeviceDocumentContainers::forceRefreshAllContainersWithCompletion(
    std::function<void()> completion) {
    _refreshQueue->async([documents = _documents, completion = std::move(completion)] {
        // The file is the daemon's own state: reading it is all there is to look at.
        static_cast<void>(documents.read());
        completion();
    });
}

void DeviceDocumentContainers::unregisterCurrentProcessAsPriorityHint() {
    if (const auto removed = _hints.removeAll(); !removed) {
        _log.write(LogLevel::error, removed.error().description);
    }
}

} // namespace nimbra::device
