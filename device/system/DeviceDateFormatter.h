#pragma once

#include "platform/system/DateFormatter.h"

#include <memory>
#include <string>
#include <unicode/smpdtfmt.h>

namespace nimbra::device {

/// Writes dates by a pattern of ICU's date fields. Any thread.
class DeviceDateFormatter final : public DateFormatter {
public:
    /// `locale` is a BCP 47 tag, `timeZone` an IANA name.
    DeviceDateFormatter(const Text& format, const std::string& locale, const std::string& timeZone);

    /// Absent where the pattern has fields that do not exist, and on a machine without ICU's data.
    [[nodiscard]] Text stringFromDate(Date date) const override;

private:
    /// Null on a machine without ICU's data.
    std::unique_ptr<const icu::SimpleDateFormat> _format;
};

} // namespace nimbra::device
