#pragma once

#include <string>

namespace nimbra {

/// What the cloud-documents daemon says of itself. Any queue.
class DaemonConnection {
public:
    virtual ~DaemonConnection() = default;

    /// The file URL below which the user's cloud documents stand.
    [[nodiscard]] virtual std::string mobileDocumentsURL() const = 0;
};

} // namespace nimbra
