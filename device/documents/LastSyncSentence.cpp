#include "device/documents/LastSyncSentence.h"

#include "device/system/LanguageChain.h"
#include "device/system/MessageFormatter.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdint>
#include <memory>
#include <string_view>
#include <unicode/calendar.h>
#include <unicode/reldatefmt.h>
#include <unicode/timezone.h>
#include <unicode/udisplaycontext.h>

namespace nimbra::device {

namespace {

/// The texts of one language.
struct Texts {
    std::string_view language;
    const char* justNow;
    /// {0} is a time such as "2 minutes ago".
    const char* ago;
    const char* yesterday;
    /// {0} is the date, {1} its day of the month.
    const char* day;
    const char* dayOfOtherYear;
};

constexpr std::array languages{
    Texts{.language = "en",
          .justNow = "Last synced just now",
          .ago = "Last synced {0}",
          .yesterday = "Last synced yesterday",
          .day = "Last synced on {0, date, ::MMMMd}",
          .dayOfOtherYear = "Last synced on {0, date, ::yMMMMd}"},
    Texts{.language = "de",
          .justNow = "Gerade eben synchronisiert",
          .ago = "Zuletzt {0} synchronisiert",
          .yesterday = "Zuletzt gestern synchronisiert",
          .day = "Zuletzt am {0, date, ::MMMMd} synchronisiert",
          .dayOfOtherYear = "Zuletzt am {0, date, ::yMMMMd} synchronisiert"},
    // Of the days of a month, the first alone is an ordinal. A pattern of letters takes blanks too.
    Texts{.language = "fr",
          .justNow = "Dernière synchronisation à l’instant",
          .ago = "Dernière synchronisation {0}",
          .yesterday = "Dernière synchronisation hier",
          .day = "Dernière synchronisation le {1, plural, =1 {1er} other {#}} {0,date,MMMM}",
          .dayOfOtherYear = "Dernière synchronisation le {1, plural, =1 {1er} other {#}} "
                            "{0,date,MMMM y}"},
    Texts{.language = "ja",
          .justNow = "たった今同期しました",
          .ago = "{0}に同期しました",
          .yesterday = "昨日同期しました",
          .day = "{0, date, ::MMMMd}に同期しました",
          .dayOfOtherYear = "{0, date, ::yMMMMd}に同期しました"},
    Texts{.language = "ar",
          .justNow = "تمت آخر مزامنة للتو",
          .ago = "تمت آخر مزامنة {0}",
          .yesterday = "تمت آخر مزامنة أمس",
          .day = "تمت آخر مزامنة في {0, date, ::MMMMd}",
          .dayOfOtherYear = "تمت آخر مزامنة في {0, date, ::yMMMMd}"},
};

/// The texts for a user of some locale, and the locale by whose rules they are filled: English
/// texts go with English months.
struct Choice {
    const Texts& texts;
    std::string locale;
};

Choice textsFor(const std::string& locale) {
    for (const std::string& tag : languageChain(locale)) {
        const auto* const texts = std::ranges::find(languages, tag, &Texts::language);
        if (texts != languages.end()) {
            return {*texts, locale};
        }
    }
    return {languages.front(), "en"};
}

std::expected<std::string, std::string> failureIn(const char* what, UErrorCode status) {
    return std::unexpected(std::string(what) + ": " + u_errorName(status));
}

/// A day of a reader's calendar.
struct Day {
    /// Counted from some day on.
    std::int32_t number = 0;
    std::int32_t ofMonth = 0;
    std::int32_t year = 0;
    std::int32_t era = 0;

    [[nodiscard]] bool isInYearOf(const Day& other) const {
        return year == other.year && era == other.era;
    }
};

Day dayOf(Date date, icu::Calendar& calendar, UErrorCode& status) {
    const std::chrono::duration<double, std::milli> sinceEpoch = date.time_since_epoch();
    calendar.setTime(sinceEpoch.count(), status);
    return {.number = calendar.get(UCAL_JULIAN_DAY, status),
            .ofMonth = calendar.get(UCAL_DATE, status),
            .year = calendar.get(UCAL_YEAR, status),
            .era = calendar.get(UCAL_ERA, status)};
}

std::expected<std::string, std::string> sentenceOfAge(const Choice& choice, std::int64_t count,
                                                      URelativeDateTimeUnit unit) {
    UErrorCode status = U_ZERO_ERROR;
    const icu::Locale rules = icu::Locale::forLanguageTag(choice.locale, status);
    const icu::RelativeDateTimeFormatter formatter(
        rules, nullptr, UDAT_STYLE_LONG, UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE, status);
    icu::UnicodeString age;
    formatter.formatNumeric(-static_cast<double>(count), unit, age, status);
    if (U_FAILURE(status) != 0) {
        return failureIn("an age", status);
    }
    std::string text;
    age.toUTF8String(text);
    // No text has a date here, so no time zone is asked for.
    return formatMessage(choice.texts.ago, {choice.locale}, "UTC",
                         std::array<FormatArgument, 1>{Text(std::move(text))});
}

} // namespace

std::expected<std::string, std::string> lastSyncSentence(Date lastSync,
                                                         const SentenceReader& reader) {
    using namespace std::chrono;
    const Choice choice = textsFor(reader.locale);
    if (reader.now - lastSync < 1min) {
        return choice.texts.justNow;
    }
    if (reader.now - lastSync < 1h) {
        return sentenceOfAge(choice, duration_cast<minutes>(reader.now - lastSync).count(),
                             UDAT_REL_UNIT_MINUTE);
    }
    UErrorCode status = U_ZERO_ERROR;
    const icu::Locale rules = icu::Locale::forLanguageTag(choice.locale, status);
    const std::unique_ptr<icu::Calendar> calendar(icu::Calendar::createInstance(
        icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8(reader.timeZone)), rules,
        status));
    if (U_FAILURE(status) != 0) {
        return failureIn("a calendar", status);
    }
    const Day today = dayOf(reader.now, *calendar, status);
    const Day day = dayOf(lastSync, *calendar, status);
    if (U_FAILURE(status) != 0) {
        return failureIn("a day", status);
    }
    if (day.number == today.number) {
        return sentenceOfAge(choice, duration_cast<hours>(reader.now - lastSync).count(),
                             UDAT_REL_UNIT_HOUR);
    }
    if (day.number + 1 == today.number) {
        return choice.texts.yesterday;
    }
    return formatMessage(
        day.isInYearOf(today) ? choice.texts.day : choice.texts.dayOfOtherYear, {choice.locale},
        reader.timeZone,
        std::array<FormatArgument, 2>{lastSync, static_cast<std::int64_t>(day.ofMonth)});
}

} // namespace nimbra::device
