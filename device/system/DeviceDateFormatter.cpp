#include "device/system/DeviceDateFormatter.h"

#include <chrono>
#include <unicode/timezone.h>
#include <utility>

namespace nimbra::device {

DeviceDateFormatter::DeviceDateFormatter(const Text& format, const std::string& locale,
                                         const std::string& timeZone) {
    UErrorCode status = U_ZERO_ERROR;
    const icu::Locale rules = icu::Locale::forLanguageTag(locale, status);
    auto made = std::make_unique<icu::SimpleDateFormat>(
        icu::UnicodeString::fromUTF8(format.string()), rules, status);
    if (U_SUCCESS(status) != 0) {
        made->adoptTimeZone(icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8(timeZone)));
        _format = std::move(made);
    }
}

Text DeviceDateFormatter::stringFromDate(Date date) const {
    if (!_format) {
        return {};
    }
    const std::chrono::duration<double, std::milli> milliseconds = date.time_since_epoch();
    UErrorCode status = U_ZERO_ERROR;
    icu::UnicodeString written;
    // The operation without a status would leave out what it does not know.
    _format->format(milliseconds.count(), written, nullptr, status);
    if (U_FAILURE(status) != 0) {
        return {};
    }
    std::string text;
    written.toUTF8String(text);
    return text;
}

} // namespace nimbra::device
