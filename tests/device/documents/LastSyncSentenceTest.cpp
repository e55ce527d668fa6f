#include "device/documents/LastSyncSentence.h"

#include "device/description/Instant.h"

#include <gtest/gtest.h>
#include <vector>

namespace nimbra::device {
namespace {

using Sentences = std::vector<std::string>;

constexpr const char* thisEvening = "2024-03-05T23:30:00Z";

/// What a reader in the time zone UTC, at the instant `now`, is told of a sync at `lastSync`.
std::string told(const std::string& locale, const std::string& lastSync,
                 const std::string& now = thisEvening, const std::string& timeZone = "UTC") {
    const auto sentence = lastSyncSentence(
        parseInstant(lastSync).value(),
        {.locale = locale, .timeZone = timeZone, .now = parseInstant(now).value()});
    return sentence ? *sentence : "error: " + sentence.error();
}

/// The sentences of every kind, from the youngest sync to the oldest; the last one is to come.
Sentences allSentences(const std::string& locale) {
    Sentences sentences;
    for (const char* const lastSync :
         {"2024-03-05T23:30:00Z", "2024-03-05T23:29:01Z", "2024-03-05T23:29:00Z",
          "2024-03-05T23:28:00Z", "2024-03-05T23:25:00Z", "2024-03-05T22:30:01Z",
          "2024-03-05T22:30:00Z", "2024-03-05T21:30:00Z", "2024-03-05T18:30:00Z",
          "2024-03-05T00:30:00Z", "2024-03-04T12:00:00Z", "2024-03-03T12:00:00Z",
          "2024-02-01T12:00:00Z", "2023-12-24T12:00:00Z", "2024-03-06T12:00:00Z"}) {
        sentences.push_back(told(locale, lastSync));
    }
    return sentences;
}

TEST(LastSyncSentenceTest, InEnglish) {
    EXPECT_EQ(
        allSentences("en-US"),
        (Sentences{"Last synced just now", "Last synced just now", "Last synced 1 minute ago",
                   "Last synced 2 minutes ago", "Last synced 5 minutes ago",
                   "Last synced 59 minutes ago", "Last synced 1 hour ago",
                   "Last synced 2 hours ago", "Last synced 5 hours ago", "Last synced 23 hours ago",
                   "Last synced yesterday", "Last synced on March 3", "Last synced on February 1",
                   "Last synced on December 24, 2023", "Last synced just now"}));
}

TEST(LastSyncSentenceTest, InGerman) {
    EXPECT_EQ(
        allSentences("de-DE"),
        (Sentences{"Gerade eben synchronisiert", "Gerade eben synchronisiert",
                   "Zuletzt vor 1 Minute synchronisiert", "Zuletzt vor 2 Minuten synchronisiert",
                   "Zuletzt vor 5 Minuten synchronisiert", "Zuletzt vor 59 Minuten synchronisiert",
                   "Zuletzt vor 1 Stunde synchronisiert", "Zuletzt vor 2 Stunden synchronisiert",
                   "Zuletzt vor 5 Stunden synchronisiert", "Zuletzt vor 23 Stunden synchronisiert",
                   "Zuletzt gestern synchronisiert", "Zuletzt am 3. März synchronisiert",
                   "Zuletzt am 1. Februar synchronisiert",
                   "Zuletzt am 24. Dezember 2023 synchronisiert", "Gerade eben synchronisiert"}));
}

TEST(LastSyncSentenceTest, InFrench) {
    EXPECT_EQ(
        allSentences("fr-FR"),
        (Sentences{
            "Dernière synchronisation à l’instant", "Dernière synchronisation à l’instant",
            "Dernière synchronisation il y a 1 minute", "Dernière synchronisation il y a 2 minutes",
            "Dernière synchronisation il y a 5 minutes",
            "Dernière synchronisation il y a 59 minutes", "Dernière synchronisation il y a 1 heure",
            "Dernière synchronisation il y a 2 heures", "Dernière synchronisation il y a 5 heures",
            "Dernière synchronisation il y a 23 heures", "Dernière synchronisation hier",
            "Dernière synchronisation le 3 mars", "Dernière synchronisation le 1er février",
            "Dernière synchronisation le 24 décembre 2023",
            "Dernière synchronisation à l’instant"}));
}

TEST(LastSyncSentenceTest, InJapanese) {
    EXPECT_EQ(allSentences("ja-JP"),
              (Sentences{"たった今同期しました", "たった今同期しました", "1 分前に同期しました",
                         "2 分前に同期しました", "5 分前に同期しました", "59 分前に同期しました",
                         "1 時間前に同期しました", "2 時間前に同期しました",
                         "5 時間前に同期しました", "23 時間前に同期しました", "昨日同期しました",
                         "3月3日に同期しました", "2月1日に同期しました",
                         "2023年12月24日に同期しました", "たった今同期しました"}));
}

TEST(LastSyncSentenceTest, InArabic) {
    EXPECT_EQ(
        allSentences("ar"),
        (Sentences{"تمت آخر مزامنة للتو", "تمت آخر مزامنة للتو", "تمت آخر مزامنة قبل دقيقة واحدة",
                   "تمت آخر مزامنة قبل دقيقتين", "تمت آخر مزامنة قبل ٥ دقائق",
                   "تمت آخر مزامنة قبل ٥٩ دقيقة", "تمت آخر مزامنة قبل ساعة واحدة",
                   "تمت آخر مزامنة قبل ساعتين", "تمت آخر مزامنة قبل ٥ ساعات",
                   "تمت آخر مزامنة قبل ٢٣ ساعة", "تمت آخر مزامنة أمس", "تمت آخر مزامنة في ٣ مارس",
                   "تمت آخر مزامنة في ١ فبراير", "تمت آخر مزامنة في ٢٤ ديسمبر ٢٠٢٣",
                   "تمت آخر مزامنة للتو"}));
}

TEST(LastSyncSentenceTest, EveryYearThatCanBeWrittenHasItsSentence) {
    EXPECT_EQ(told("en-US", "0001-06-01T12:00:00Z"), "Last synced on June 3, 1");
    EXPECT_EQ(told("en-US", "1700-01-02T12:00:00Z"), "Last synced on January 2, 1700");
    EXPECT_EQ(told("en-US", "9999-12-31T12:00:00Z"), "Last synced just now");
}

TEST(LastSyncSentenceTest, ARegionHasTheRulesOfItsOwn) {
    EXPECT_EQ(told("en-GB", "2023-12-24T12:00:00Z"), "Last synced on 24 December 2023");
    EXPECT_EQ(told("de-AT", "2024-01-02T12:00:00Z"), "Zuletzt am 2. Jänner synchronisiert");
    EXPECT_EQ(told("ar-AE", "2024-03-05T23:25:00Z"), "تمت آخر مزامنة قبل 5 دقائق");
}

TEST(LastSyncSentenceTest, ALanguageWithoutTextsIsToldInEnglishThroughout) {
    EXPECT_EQ(told("it-IT", "2024-03-05T23:25:00Z"), "Last synced 5 minutes ago");
    EXPECT_EQ(told("it-IT", "2023-12-24T12:00:00Z"), "Last synced on December 24, 2023");
    EXPECT_EQ(told("ja-Latn", "2024-03-04T12:00:00Z"), "Last synced yesterday");
}

TEST(LastSyncSentenceTest, DaysBeginAndEndWhereTheReaderIs) {
    const std::string now = "2024-03-05T20:00:00Z";

    EXPECT_EQ(told("en", "2024-03-05T14:00:00Z", now, "UTC"), "Last synced 6 hours ago");
    // There the 6th has begun.
    EXPECT_EQ(told("en", "2024-03-05T14:00:00Z", now, "Asia/Tokyo"), "Last synced yesterday");
    EXPECT_EQ(told("en", "2024-03-04T14:00:00Z", now, "Asia/Tokyo"), "Last synced on March 4");
    EXPECT_EQ(told("en", "2024-03-03T20:00:00Z", now, "Asia/Tokyo"), "Last synced on March 4");
}

TEST(LastSyncSentenceTest, MinutesAreToldAcrossMidnightButHoursAreNot) {
    const std::string now = "2024-01-01T00:30:00Z";

    EXPECT_EQ(told("en", "2023-12-31T23:45:00Z", now), "Last synced 45 minutes ago");
    EXPECT_EQ(told("en", "2023-12-31T23:30:00Z", now), "Last synced yesterday");
    EXPECT_EQ(told("en", "2023-12-30T23:30:00Z", now), "Last synced on December 30, 2023");
}

TEST(LastSyncSentenceTest, ADayThatIsAnHourShorterIsADay) {
    const std::string morningAfter = "2024-03-31T23:30:00+02:00";

    EXPECT_EQ(told("en", "2024-03-31T00:30:00+01:00", morningAfter, "Europe/Berlin"),
              "Last synced 22 hours ago");
    EXPECT_EQ(told("en", "2024-03-30T00:30:00+01:00", morningAfter, "Europe/Berlin"),
              "Last synced yesterday");
}

TEST(LastSyncSentenceTest, TheYearIsOneOfTheReadersCalendar) {
    // The year 1445 began in July 2023 and ended in July 2024.
    EXPECT_EQ(told("ar-SA", "2023-12-24T12:00:00Z"), "تمت آخر مزامنة في ١١ جمادى الآخرة");
}

} // namespace
} // namespace nimbra::device
