#pragma once

#include "device/DeviceDescription.h"
#include "device/documents/PriorityHints.h"
#include "platform/documents/DocumentContainer.h"

#include <string>

namespace nimbra::device {

/// A container as the daemon described it when it was asked.
class DeviceDocumentContainer final : public DocumentContainer {
public:
    DeviceDocumentContainer(DeviceDescription::Container description, PriorityHints hints);

    /// The application that the container belongs to.
    [[nodiscard]] const std::string& identifier() const { return _description.identifier; }

    [[nodiscard]] bool isDocumentScopePublic() const override;
    [[nodiscard]] std::expected<void, Error>
    registerCurrentProcessAsPriorityHintWithError() override;

private:
    DeviceDescription::Container _description;
    PriorityHints _hints;
};

} // namespace nimbra::device
