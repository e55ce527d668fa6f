#include "host/core/trace/TracingDocumentContainers.h"

#include "device/documents/DeviceDocumentContainer.h"
#include "host/core/trace/Trace.h"

#include <utility>

namespace nimbra::host {

namespace {

/// What the trace calls a container. Only the device's own say who they are.
nlohmann::ordered_json identifierOf(const DocumentContainer& container) {
    const auto* own = dynamic_cast<const device::DeviceDocumentContainer*>(&container);
    return own != nullptr ? nlohmann::ordered_json(own->identifier()) : nlohmann::ordered_json();
}

class TracingDocumentContainer final : public DocumentContainer {
public:
    TracingDocumentContainer(std::shared_ptr<DocumentContainer> container, Trace& trace)
        : _container(std::move(container)), _trace(trace) {}

    [[nodiscard]] bool isDocumentScopePublic() const override {
        return _container->isDocumentScopePublic();
    }
    [[nodiscard]] std::expected<void, Error>
    registerCurrentProcessAsPriorityHintWithError() override {
        _trace.write("container", {{"op", "registerCurrentProcessAsPriorityHintWithError:"},
                                   {"container", identifierOf(*_container)}});
        return _container->registerCurrentProcessAsPriorityHintWithError();
    }

private:
    std::shared_ptr<DocumentContainer> _container;
    Trace& _trace;
};

} // namespace

std::vector<std::shared_ptr<DocumentContainer>> TracingDocumentContainers::allContainers() {
    auto containers = _containers.allContainers();
    for (auto& container : containers) {
        container = std::make_shared<TracingDocumentContainer>(std::move(container), _trace);
    }
    return containers;
}

void TracingDocumentContainers::forceRefreshAllContainersWithCompletion(
    std::function<void()> completion) {
    _trace.write("container", {{"op", "forceRefreshAllContainersWithCompletion:"}});
    _containers.forceRefreshAllContainersWithCompletion(std::move(completion));
}

void TracingDocumentContainers::unregisterCurrentProcessAsPriorityHint() {
    _trace.write("container", {{"op", "unregisterCurrentProcessAsPriorityHint"}});
    _containers.unregisterCurrentProcessAsPriorityHint();
}

} // namespace nimbra::host
