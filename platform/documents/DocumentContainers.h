#pragma once

#include "platform/documents/DocumentContainer.h"

#include <functional>
#include <memory>
#include <vector>

namespace nimbra {

/// All document containers of the identity that is signed in: what concerns every container at
/// once. Any queue.
class DocumentContainers {
public:
    virtual ~DocumentContainers() = default;

    /// The containers known now, in the daemon's order; the caller owns the objects. None while no
    /// identity is signed in, and when the daemon's list cannot be read, which is logged.
    [[nodiscard]] virtual std::vector<std::shared_ptr<DocumentContainer>> allContainers() = 0;

    /// Asks the daemon to look for changes in all containers. Returns at once; `completion` is
    /// called once, on a queue of the platform's choosing, when it has looked.
    virtual void forceRefreshAllContainersWithCompletion(std::function<void()> completion) = 0;

    /// Takes back every priority hint of this process; nothing when there is none. Where that fails
    /// the platform logs the reason.
    virtual void unregisterCurrentProcessAsPriorityHint() = 0;
};

} // namespace nimbra
