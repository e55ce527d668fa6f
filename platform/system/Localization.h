#pragma once

#include "platform/system/DateFormatter.h"
#include "platform/system/Locale.h"
#include "platform/values/Date.h"
#include "platform/values/Text.h"

#include <cstdint>
#include <memory>
#include <span>
#include <variant>

namespace nimbra {

/// What a placeholder of a text format is filled with.
using FormatArgument = std::variant<std::int64_t, Text, Date>;

/// The user's locale, and what depends on it. Any queue.
class Localization {
public:
    virtual ~Localization() = default;

    [[nodiscard]] virtual Locale currentLocale() const = 0;

    /// `format` with its placeholders filled from `arguments` by the rules of `locale`. A format
    /// without placeholders comes back as it stands, and so does one that cannot be filled,
    /// which is logged.
    [[nodiscard]] virtual Text
    stringWithFormatLocaleArguments(const Text& format, const Locale& locale,
                                    std::span<const FormatArgument> arguments) const = 0;

    /// Orders two names the way a person expects them in a list: letter case ignored, runs of
    /// digits by their numeric value, by the rules of the current locale. Negative when `left`
    /// comes first, zero when neither does. An absent text comes before every other.
    [[nodiscard]] virtual int localizedStandardCompare(const Text& left,
                                                       const Text& right) const = 0;

    /// A formatter for `format`, a pattern of date fields such as "yy.MM.dd". Never null.
    [[nodiscard]] virtual std::unique_ptr<DateFormatter>
    dateFormatterWithFormat(const Text& format) const = 0;
};

} // namespace nimbra
