#pragma once

#include "platform/values/Error.h"

#include <expected>

namespace nimbra {

/// One application's document container in the cloud. May be used on any queue, one at a time.
class DocumentContainer {
public:
    virtual ~DocumentContainer() = default;

    /// Whether people see the container's documents, not only its application.
    [[nodiscard]] virtual bool isDocumentScopePublic() const = 0;

    /// Tells the daemon that this process looks at the container, so that it is synced first.
    /// Repeating it changes nothing.
    [[nodiscard]] virtual std::expected<void, Error>
    registerCurrentProcessAsPriorityHintWithError() = 0;
};

} // namespace nimbra
