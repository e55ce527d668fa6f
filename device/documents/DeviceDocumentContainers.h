#pragma once

#include "device/documents/DocumentsFile.h"
#include "device/documents/PriorityHints.h"
#include "platform/documents/DocumentContainers.h"

#include <memory>

namespace nimbra {
class SystemLog;
class WorkQueue;
} // namespace nimbra

namespace nimbra::device {

/// The containers in the device's `documents.json`, read anew at each question; none while no
/// identity is signed in. Any thread.
class DeviceDocumentContainers final : public DocumentContainers {
public:
    /// Refreshes run on `refreshQueue`. `log` is not owned and outlives the containers and the
    /// work on the queue.
    DeviceDocumentContainers(const DevicePaths& paths, std::shared_ptr<WorkQueue> refreshQueue,
                             SystemLog& log);
    /// Takes this process's hints back, as the daemon does for a process that has ended.
    ~DeviceDocumentContainers() override;

    [[nodiscard]] std::vector<std::shared_ptr<DocumentContainer>> allContainers() override;
    void forceRefreshAllContainersWithCompletion(std::function<void()> completion) override;
    void unregisterCurrentProcessAsPriorityHint() override;

private:
    DocumentsFile _documents;
    PriorityHints _hints;
    std::shared_ptr<WorkQueue> _refreshQueue;
    SystemLog& _log;
};

} // namespace nimbra::device
