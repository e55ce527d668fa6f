#include "device/documents/DeviceDocumentContainer.h"

#include "device/DeviceError.h"

#include <utility>

namespace nimbra::device {

DeviceDocumentContainer::DeviceDocumentContainer(DeviceDescription::Container description,
                                                 PriorityHints hints)
    : _description(std::move(description)), _hints(std::move(hints)) {}

bool DeviceDocumentContainer::isDocumentScopePublic() const {
    return _description.isPublic;
}

std::expected<void, Error>
DeviceDocumentContainer::registerCurrentProcessAsPriorityHintWithError() {
    if (_description.registrationFails) {
        return std::unexpected(
            deviceError(_description.identifier + ": the daemon refuses the priority hint"));
    }
    return _hints.add(_description.identifier);
}

} // namespace nimbra::device
