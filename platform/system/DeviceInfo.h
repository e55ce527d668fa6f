#pragma once

#include "platform/values/Text.h"

namespace nimbra {

/// Answers questions about the device. Any queue.
class DeviceInfo {
public:
    virtual ~DeviceInfo() = default;

    /// The answer to a yes-or-no question such as "cellular-data"; false for one it does not know.
    [[nodiscard]] virtual bool boolAnswerForQuestion(const Text& question) const = 0;

    /// The localization key for this device's wording of wireless networks in the text under
    /// `key`; `key` itself where the device has no wording of its own.
    [[nodiscard]] virtual Text VariantStringKeyForKey(const Text& key) const = 0;
};

} // namespace nimbra
