#pragma once

#include "platform/values/Text.h"
#include "platform/views/Screen.h"

#include <cstdint>
#include <optional>

namespace nimbra {

/// What kind of device it is to its user; the numbers are the platform's.
enum class UserInterfaceIdiom : std::uint8_t { phone = 0, pad = 1 };

/// Answers questions about the device. Any queue.
class DeviceInfo {
public:
    virtual ~DeviceInfo() = default;

    /// The answer to a yes-or-no question such as "cellular-data"; false for one it does not know.
    [[nodiscard]] virtual bool boolAnswerForQuestion(const Text& question) const = 0;

    /// The answer in words to a question such as "UserAssignedDeviceName", the name that the user
    /// gave the device; absent for one it does not know.
    [[nodiscard]] virtual Text copyAnswerForQuestion(const Text& question) const = 0;

    /// The localization key for this device's wording of wireless networks in the text under
    /// `key`; `key` itself where the device has no wording of its own.
    [[nodiscard]] virtual Text VariantStringKeyForKey(const Text& key) const = 0;

    [[nodiscard]] virtual UserInterfaceIdiom userInterfaceIdiom() const = 0;

    /// The screen that the user looks at; nothing on a device without one.
    [[nodiscard]] virtual std::optional<Screen> mainScreen() const = 0;
};

} // namespace nimbra
