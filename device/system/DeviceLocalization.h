#pragma once

#include "platform/system/Localization.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <vector>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

class DeviceSettings;

/// Comparing and formatting by the rules of ICU. Any thread.
///
/// Dates are shown in the device's time zone; their placeholders stand outside those of plurals
/// and choices. A format that cannot be filled comes back as it stands, with a line in the log: one
/// for each fault, however often the format is used.
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
    /// Of the locale and the time zone that the device has when the formatter is made.
    [[nodiscard]] std::unique_ptr<DateFormatter>
    dateFormatterWithFormat(const Text& format) const override;

private:
    class Order;
    [[nodiscard]] const Order& orderOfUser() const;
    [[nodiscard]] const Order& findOrder() const;
    void logOnce(const std::string& line) const;

    const DeviceSettings& _settings;
    SystemLog& _log;
    /// The order of the user's locale as of the revision of the settings behind it, so that a
    /// comparison takes no lock. The revision is set last and asked for first.
    mutable std::atomic<const Order*> _order = nullptr;
    mutable std::atomic<std::uint64_t> _revision = 0;
    mutable std::mutex _mutex;
    /// The orders of all locales so far: another thread may still compare by an earlier one.
    mutable std::vector<std::unique_ptr<const Order>> _orders;
    /// What the log has been told; under the mutex.
    mutable std::set<std::string> _logged;
};

} // namespace nimbra::device
