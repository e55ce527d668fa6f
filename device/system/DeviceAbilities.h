#pragma once

#include "platform/system/DeviceInfo.h"

namespace nimbra::device {

class DeviceSettings;

/// Answers from the device's settings. Any thread.
class DeviceAbilities final : public DeviceInfo {
public:
    /// `settings` is not owned and outlives the answers.
    explicit DeviceAbilities(const DeviceSettings& settings);

    [[nodiscard]] bool boolAnswerForQuestion(const Text& question) const override;
    [[nodiscard]] Text copyAnswerForQuestion(const Text& question) const override;
    [[nodiscard]] Text VariantStringKeyForKey(const Text& key) const override;
    [[nodiscard]] UserInterfaceIdiom userInterfaceIdiom() const override;
    [[nodiscard]] std::optional<Screen> mainScreen() const override;

private:
    const DeviceSettings& _settings;
};

} // namespace nimbra::device
