#pragma once

#include "platform/system/Localization.h"

#include <memory>
#include <mutex>
#include <string>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

class DeviceSettings;

/// Comparing and formatting by the rules of ICU. Any thread.
///
/// Dates are shown in the device's time zone; their placeholders stand outside those of plurals
/// and choices. A format that cannot be filled comes back as it stands, with a line in the log.
class DeviceLocalization final : public Localization {
public:
    /// Neither `settings` nor `log` is owned; both outlive it.
    DeviceLocalization(const DeviceSettings& settings, SystemLog& log);
    ~DeviceLocalization() override;

    [[nodiscard]] Locale currentLocale() const override;
    [[nodiscard]] Text
    stringWithFormatLocaleArguments(const Text& format, const Locale& locale,
                                    std::span<const FormatArgument> arguments) const override;
    [[nodiscard]] int localizedStandardCompare(const Text& left, const Text& right) const override;

private:
    class Order;
    [[nodiscard]] std::shared_ptr<const Order> orderOfUser() const;

    const DeviceSettings& _settings;
    SystemLog& _log;
    mutable std::mutex _mutex;
    /// The order of the locale that was asked for last: making one costs more than many
    /// comparisons.
    mutable std::shared_ptr<const Order> _order;
};

} // namespace nimbra::device
