#pragma once

#include "device/DeviceDescription.h"
#include "device/documents/PriorityHints.h"
#include "platform/documents/DocumentContainer.h"

namespace nimbra::device {

/// A container as the daemon described it when it was asked.
class DeviceDocumentContainer final : public DocumentContainer {
public:
    DeviceDocumentContainer(DeviceDescription::Container description, PriorityHints hints);

    [[nodiscard]] bool isDocumentScopePublic() const override;
    [[nodiscard]] std::expected<void, Error>
    registerCurrentProcessAsPriorityHintWithError() override;

private:
    DeviceDescription::Container _description;
    PriorityHints _hints;
};

} // namespace nimbra::device
