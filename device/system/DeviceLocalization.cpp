#include "device/system/DeviceLocalization.h"

#include "device/system/DeviceDateFormatter.h"
#include "device/system/DeviceSettings.h"
#include "device/system/MessageFormatter.h"
#include "platform/system/SystemLog.h"

#include <algorithm>
#include <unicode/coll.h>
#include <utility>

namespace nimbra::device {

/// How the names of a list are ordered in one locale.
class DeviceLocalization::Order {
public:
    explicit Order(std::string locale) : _locale(std::move(locale)) {
        UErrorCode status = U_ZERO_ERROR;
        _collator.reset(
            icu::Collator::createInstance(icu::Locale::forLanguageTag(_locale, status), status));
        if (U_SUCCESS(status) != 0) {
            // Accents count, letter case does not.
            _collator->setStrength(icu::Collator::SECONDARY);
            _collator->setAttribute(UCOL_NUMERIC_COLLATION, UCOL_ON, status);
        }
    }

    [[nodiscard]] const std::string& locale() const { return _locale; }

    [[nodiscard]] int compare(const std::string& left, const std::string& right) const {
        if (!_collator) {
            return left.compare(right);
        }
        UErrorCode status = U_ZERO_ERROR;
        return _collator->compareUTF8(left, right, status);
    }

private:
    std::string _locale;
    /// Null on a machine without ICU's data.
    std::unique_ptr<icu::Collator> _collator;
};

DeviceLocalization::DeviceLocalization(const DeviceSettings& settings, SystemLog& log)
    : _settings(settings), _log(log) {}

DeviceLocalization::~DeviceLocalization() = default;

nimbra::Locale DeviceLocalization::currentLocale() const {
    return {_settings.localeIdentifier()};
}

Text DeviceLocalization::stringWithFormatLocaleArguments(
    const Text& format, const nimbra::Locale& locale,
    std::span<const FormatArgument> arguments) const {
    auto filled = formatMessage(format.string(), locale, _settings.timeZone(), arguments);
    if (!filled) {
        logOnce("Can't fill the format \"" + format.string() + "\": " + filled.error());
        return format;
    }
    return *filled == format.string() ? format : Text(std::move(*filled));
}

void DeviceLocalization::logOnce(const std::string& line) const {
    bool isNew = false;
    {
        const std::scoped_lock lock(_mutex);
        isNew = _logged.insert(line).second;
    }
    if (isNew) {
        _log.write(LogLevel::error, line);
    }
}

int DeviceLocalization::localizedStandardCompare(const Text& left, const Text& right) const {
    if (!left || !right) {
        return static_cast<int>(left.isPresent()) - static_cast<int>(right.isPresent());
    }
    return orderOfUser().compare(left.string(), right.string());
}

std::unique_ptr<DateFormatter>
DeviceLocalization::dateFormatterWithFormat(const Text& format) const {
    return std::make_unique<DeviceDateFormatter>(format, _settings.localeIdentifier(),
                                                 _settings.timeZone());
}

const DeviceLocalization::Order& DeviceLocalization::orderOfUser() const {
    if (_revision.load(std::memory_order_acquire) == _settings.localeRevision()) {
        return *_order.load(std::memory_order_relaxed);
    }
    return findOrder();
}

const DeviceLocalization::Order& DeviceLocalization::findOrder() const {
    const std::scoped_lock lock(_mutex);
    // Asked before the locale: where that changes in between, the next comparison comes back here.
    const std::uint64_t revision = _settings.localeRevision();
    std::string locale = _settings.localeIdentifier();
    auto order = std::ranges::find(_orders, locale, &Order::locale);
    if (order == _orders.end()) {
        order = _orders.insert(order, std::make_unique<const Order>(std::move(locale)));
    }
    _order.store(order->get(), std::memory_order_relaxed);
    _revision.store(revision, std::memory_order_release);
    return **order;
}

} // namespace nimbra::device
