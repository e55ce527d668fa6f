#pragma once

#include "platform/documents/DocumentContainers.h"

#include <functional>
#include <memory>
#include <vector>

namespace nimbra::host {

class Trace;

/// Traces what is asked of other document containers.
class TracingDocumentContainers final : public DocumentContainers {
public:
    /// Neither is owned; both outlive this one, and `trace` its containers as well.
    TracingDocumentContainers(DocumentContainers& containers, Trace& trace)
        : _containers(containers), _trace(trace) {}

    [[nodiscard]] std::vector<std::shared_ptr<DocumentContainer>> allContainers() override;
    void forceRefreshAllContainersWithCompletion(std::function<void()> completion) override;
    void unregisterCurrentProcessAsPriorityHint() override;

private:
    DocumentContainers& _containers;
    Trace& _trace;
};

} // namespace nimbra::host
