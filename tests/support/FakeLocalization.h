#pragma once

#include "platform/system/Localization.h"

#include <chrono>
#include <cstring>
#include <memory>
#include <string>
#include <string_view>
#include <strings.h>
#include <utility>
#include <vector>

namespace nimbra::test {

/// Replaces "{0}" by the first argument and notes the locale that was handed over. Compares names
/// without letter case and with digit runs by their value, in ASCII.
class FakeLocalization final : public Localization {
public:
    [[nodiscard]] Locale currentLocale() const override { return {"de-DE"}; }

    [[nodiscard]] Text
    stringWithFormatLocaleArguments(const Text& format, const Locale& locale,
                                    std::span<const FormatArgument> arguments) const override {
        locales.push_back(locale);
        std::string filled = format.string();
        if (const auto place = filled.find("{0}"); place != std::string::npos) {
            filled.replace(place, std::string_view("{0}").size(), asString(arguments.front()));
        }
        return Text(filled);
    }

    [[nodiscard]] int localizedStandardCompare(const Text& left, const Text& right) const override {
        if (!left || !right) {
            return static_cast<int>(left.isPresent()) - static_cast<int>(right.isPresent());
        }
        return strverscmp(lowered(left).c_str(), lowered(right).c_str());
    }

    /// Writes the format and, in seconds of the epoch, the date.
    [[nodiscard]] std::unique_ptr<DateFormatter>
    dateFormatterWithFormat(const Text& format) const override {
        class Formatter final : public DateFormatter {
        public:
            explicit Formatter(Text format) : _format(std::move(format)) {}
            [[nodiscard]] Text stringFromDate(Date date) const override {
                const auto seconds =
                    std::chrono::floor<std::chrono::seconds>(date).time_since_epoch().count();
                return Text(_format.string() + '@' + std::to_string(seconds));
            }

        private:
            Text _format;
        };
        return std::make_unique<Formatter>(format);
    }

    /// The locales handed to the formatter, in order.
    mutable std::vector<Locale> locales;

private:
    static std::string asString(const FormatArgument& argument) {
        const auto* text = std::get_if<Text>(&argument);
        return text != nullptr ? text->string() : std::to_string(std::get<std::int64_t>(argument));
    }

    static std::string lowered(const Text& text) {
        std::string letters = text.string();
        for (char& letter : letters) {
            letter = static_cast<char>(std::tolower(static_cast<unsigned char>(letter)));
        }
        return letters;
    }
};

} // namespace nimbra::test
