#pragma once

#include "platform/system/Localization.h"

#include <expected>
#include <span>
#include <string>

namespace nimbra::device {

/// Fills the placeholders of `pattern`, an ICU MessageFormat pattern with arguments numbered from
/// 0, by the rules of `locale` and, for dates, in the time zone `timeZone`. A pattern without
/// placeholders comes back as it stands. The error says what is wrong with the pattern.
[[nodiscard]] std::expected<std::string, std::string>
formatMessage(const std::string& pattern, const Locale& locale, const std::string& timeZone,
              std::span<const FormatArgument> arguments);

} // namespace nimbra::device
