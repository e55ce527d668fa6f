#include "device/system/MessageFormatter.h"

#include <memory>
#include <unicode/datefmt.h>
#include <unicode/messagepattern.h>
#include <unicode/msgfmt.h>
#include <unicode/timezone.h>
#include <variant>
#include <vector>

namespace nimbra::device {

namespace {

icu::Formattable formattable(const FormatArgument& argument) {
    if (const auto* number = std::get_if<std::int64_t>(&argument)) {
        return {*number};
    }
    if (const auto* text = std::get_if<Text>(&argument)) {
        return {icu::UnicodeString::fromUTF8(text->string())};
    }
    const auto sinceEpoch = std::get<Date>(argument).time_since_epoch();
    const std::chrono::duration<double, std::milli> milliseconds = sinceEpoch;
    return {milliseconds.count(), icu::Formattable::kIsDate};
}

using Placeholders = std::vector<std::size_t>;

/// The numbers of the outermost placeholders of `pattern`, in its order; the error says why they
/// cannot be filled from `arguments`.
std::expected<Placeholders, std::string>
outermostPlaceholders(const icu::MessagePattern& pattern,
                      std::span<const FormatArgument> arguments) {
    Placeholders outermost;
    int endOfOutermost = 0;
    for (int index = 0; index < pattern.countParts(); ++index) {
        if (pattern.getPartType(index) != UMSGPAT_PART_TYPE_ARG_START) {
            continue;
        }
        const icu::MessagePattern::Part& name = pattern.getPart(index + 1);
        if (name.getType() != UMSGPAT_PART_TYPE_ARG_NUMBER) {
            return std::unexpected("a placeholder has a name where a number was expected");
        }
        const auto number = static_cast<std::size_t>(name.getValue());
        if (number >= arguments.size()) {
            return std::unexpected("there is no argument " + std::to_string(number));
        }
        if (index >= endOfOutermost) {
            outermost.push_back(number);
            endOfOutermost = pattern.getLimitPartIndex(index);
        } else if (std::holds_alternative<Date>(arguments[number])) {
            return std::unexpected("a date stands inside another placeholder");
        }
    }
    return outermost;
}

/// Makes the placeholders of dates show the time in `timeZone`; by itself the library takes the
/// machine's.
void useTimeZone(icu::MessageFormat& message, const Placeholders& placeholders,
                 std::span<const FormatArgument> arguments, const icu::Locale& locale,
                 const std::string& timeZone) {
    const std::unique_ptr<icu::TimeZone> zone(
        icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8(timeZone)));
    int count = 0;
    const icu::Format* const* const first = message.getFormats(count);
    const std::span formats(first, static_cast<std::size_t>(count));
    std::vector<std::unique_ptr<icu::DateFormat>> dates(placeholders.size());
    for (std::size_t index = 0; index < placeholders.size(); ++index) {
        if (!std::holds_alternative<Date>(arguments[placeholders[index]])) {
            continue;
        }
        const auto* const given = dynamic_cast<const icu::DateFormat*>(formats[index]);
        dates[index].reset(given != nullptr
                               ? given->clone()
                               : icu::DateFormat::createDateTimeInstance(
                                     icu::DateFormat::kShort, icu::DateFormat::kShort, locale));
        dates[index]->setTimeZone(*zone);
    }
    // Only now, as adopting a format ends the list above.
    for (std::size_t index = 0; index < dates.size(); ++index) {
        if (dates[index]) {
            message.adoptFormat(static_cast<int>(index), dates[index].release());
        }
    }
}

} // namespace

std::expected<std::string, std::string> formatMessage(const std::string& pattern,
                                                      const nimbra::Locale& locale,
                                                      const std::string& timeZone,
                                                      std::span<const FormatArgument> arguments) {
    if (!pattern.contains('{')) {
        return pattern;
    }
    UErrorCode status = U_ZERO_ERROR;
    UParseError place{};
    const icu::MessagePattern parsed(icu::UnicodeString::fromUTF8(pattern), &place, status);
    if (U_FAILURE(status) != 0) {
        return std::unexpected("malformed near character " + std::to_string(place.offset + 1));
    }
    const auto placeholders = outermostPlaceholders(parsed, arguments);
    if (!placeholders) {
        return std::unexpected(placeholders.error());
    }
    if (placeholders->empty()) {
        return pattern;
    }
    const icu::Locale rules = icu::Locale::forLanguageTag(locale.identifier, status);
    icu::MessageFormat message(icu::UnicodeString::fromUTF8(pattern), rules, place, status);
    if (U_FAILURE(status) == 0) {
        useTimeZone(message, *placeholders, arguments, rules, timeZone);
    }
    std::vector<icu::Formattable> values;
    for (const FormatArgument& argument : arguments) {
        values.push_back(formattable(argument));
    }
    icu::UnicodeString filled;
    icu::FieldPosition nowhere;
    message.format(values.data(), static_cast<int>(values.size()), filled, nowhere, status);
    if (U_FAILURE(status) != 0) {
        return std::unexpected(u_errorName(status));
    }
    std::string text;
    filled.toUTF8String(text);
    return text;
}

} // namespace nimbra::device
