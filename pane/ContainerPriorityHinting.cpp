#include "pane/RSPNimbraDriveViewController.h"
#include "platform/documents/DocumentContainers.h"
#include "platform/system/FileManager.h"
#include "platform/system/WorkQueues.h"

namespace nimbra {

namespace {

/// Makes this process a priority client of every container whose documents people see. Runs on the
/// hinting queue.
void registerAsPriorityClient(const PlatformServices& services) {
    if (!services.fileManager->tidewaterIdentityToken()) {
        return;
    }
    for (const auto& container : services.documentContainers->allContainers()) {
        if (container->isDocumentScopePublic()) {
            // A hint that fails costs only speed, and the next change asks again: the error is
            // dropped and the other containers go on.
            static_cast<void>(container->registerCurrentProcessAsPriorityHintWithError());
        }
    }
}

} // namespace

void RSPNimbraDriveViewController::_registerContainerPriorityHinting() {
    // Notifications arrive on any queue, so the first request may be made by two at once.
    std::call_once(_containerPriorityHintingCreation, [this] {
        WorkQueues& workQueues = services().workQueues;
        _containerPriorityHintingQueue =
            workQueues.serialQueueWithLabel("container-priority-hinting");
        _containerPriorityHintingSource =
            workQueues.dataOrSourceOnQueue(_containerPriorityHintingQueue);
        _containerPriorityHintingSource->setEventHandler(
            [services = services()] { registerAsPriorityClient(services); });
        _containerPriorityHintingSource->resume();
    });
    _containerPriorityHintingSource->mergeData(1);
}

/// Takes the registration back, after every run that was asked for before. The pane's first
/// appearance has made the queue, so reading it here races with nobody; before that there is
/// nothing to take back.
void RSPNimbraDriveViewController::_unregisterContainerPriorityHinting() {
    if (_containerPriorityHintingQueue) {
        _containerPriorityHintingQueue->async([containers = services().documentContainers] {
            containers->unregisterCurrentProcessAsPriorityHint();
        });
    }
}

} // namespace nimbra
