#include "device/system/DeviceLocalization.h"

#include "device/system/DeviceSettings.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/Threads.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <atomic>
#include <gtest/gtest.h>
#include <initializer_list>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using Names = std::vector<std::string>;

class DeviceLocalizationTest : public testing::Test {
protected:
    DeviceLocalizationTest() {
        test::writeTestFile(_directory.path() / "var/lib/nimbra/device.json",
                            R"({"locale": "en-US", "timeZone": "Asia/Tokyo"})");
        _settings.emplace(DeviceSettings::open(_directory.path()).value());
        _localization.emplace(*_settings, _log);
    }

    void changeLocale(const std::string& locale) {
        test::writeTestFile(_directory.path() / "var/lib/nimbra/device.json",
                            R"({"locale": ")" + locale + R"("})");
        ASSERT_TRUE(_settings->reload());
    }

    [[nodiscard]] DeviceSettings& settings() { return *_settings; }
    [[nodiscard]] const DeviceLocalization& localization() const { return *_localization; }
    [[nodiscard]] const test::RecordingLog& log() const { return _log; }

    [[nodiscard]] std::string formatted(const std::string& locale, const Text& format,
                                        std::initializer_list<FormatArgument> arguments) const {
        return localization().stringWithFormatLocaleArguments(format, {locale}, arguments).string();
    }

    [[nodiscard]] Names sorted(Names names) const {
        std::ranges::stable_sort(names, [this](const auto& left, const auto& right) {
            return localization().localizedStandardCompare(Text(left), Text(right)) < 0;
        });
        return names;
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    std::optional<DeviceSettings> _settings;
    std::optional<DeviceLocalization> _localization;
};

TEST_F(DeviceLocalizationTest, TheLocaleIsTheDevicesNow) {
    EXPECT_EQ(localization().currentLocale(), Locale{"en-US"});
    settings().overrideLocale("ar");
    EXPECT_EQ(localization().currentLocale(), Locale{"ar"});
}

TEST_F(DeviceLocalizationTest, NamesAreOrderedAsAPersonExpects) {
    EXPECT_EQ(sorted({"Zeta", "App 10", "app 2", "alpha", "App 2b"}),
              (Names{"alpha", "app 2", "App 2b", "App 10", "Zeta"}));
}

TEST_F(DeviceLocalizationTest, LetterCaseIsIgnoredAndAccentsCount) {
    const auto compare = [this](const char* left, const char* right) {
        return localization().localizedStandardCompare(Text(left), Text(right));
    };
    EXPECT_EQ(compare("notes", "NOTES"), 0);
    EXPECT_EQ(compare("a", "a"), 0);
    EXPECT_LT(compare("a", "á"), 0);
    EXPECT_GT(compare("á", "a"), 0);
    EXPECT_LT(compare("á", "b"), 0);
}

TEST_F(DeviceLocalizationTest, NamesThatCompareEqualKeepTheirOrder) {
    EXPECT_EQ(sorted({"Notes", "App 1", "NOTES", "app 01", "notes", "APP 1"}),
              (Names{"App 1", "app 01", "APP 1", "Notes", "NOTES", "notes"}));
}

TEST_F(DeviceLocalizationTest, RunsOfDigitsAreNumbersHoweverLong) {
    EXPECT_EQ(sorted({"App 100", "App 20", "App " + std::string(40, '9'), "App 3", "App v1.10",
                      "App v1.9", "10 Apps", "9 Apps"}),
              (Names{"9 Apps", "10 Apps", "App 3", "App 20", "App 100",
                     "App " + std::string(40, '9'), "App v1.9", "App v1.10"}));
}

TEST_F(DeviceLocalizationTest, EveryNameHasItsPlace) {
    const Names names{"", " ", "!", "😀 Fun", "7", "Zoë", "ملاحظات", "備忘錄", "\xFF\xFE"};
    const auto order = sorted(names);
    EXPECT_EQ(order.size(), names.size());
    EXPECT_EQ(order.front(), "");
    EXPECT_EQ(sorted({order.rbegin(), order.rend()}), order);
}

TEST_F(DeviceLocalizationTest, TheOrderFollowsTheLocale) {
    settings().overrideLocale("de");
    EXPECT_EQ(sorted({"Zebra", "Öl", "Ofen", "Ärger", "Apfel"}),
              (Names{"Apfel", "Ärger", "Ofen", "Öl", "Zebra"}));

    settings().overrideLocale("sv");
    EXPECT_EQ(sorted({"Zebra", "Öl", "Ofen", "Ärger", "Apfel"}),
              (Names{"Apfel", "Ofen", "Zebra", "Ärger", "Öl"}));
}

TEST_F(DeviceLocalizationTest, TheOrderFollowsAFileThatWasReadAgain) {
    const auto compare = [this] {
        return localization().localizedStandardCompare(Text("Ärger"), Text("Zebra"));
    };
    EXPECT_LT(compare(), 0);
    changeLocale("sv");
    EXPECT_GT(compare(), 0);
    changeLocale("en-US");
    EXPECT_LT(compare(), 0);
}

TEST_F(DeviceLocalizationTest, NamesAreComparedWhileTheLocaleChanges) {
    std::atomic<int> unexpected = 0;
    const auto compare = [&] {
        for (int time = 0; time < 2000; ++time) {
            unexpected +=
                localization().localizedStandardCompare(Text("App 10"), Text("app 9")) <= 0;
        }
    };
    const auto change = [&] {
        for (int time = 0; time < 200; ++time) {
            settings().overrideLocale(time % 2 == 0 ? "sv" : "de");
        }
    };
    test::runAtOnce({compare, compare, change});

    EXPECT_EQ(unexpected, 0);
    EXPECT_LT(localization().localizedStandardCompare(Text("Ärger"), Text("Zebra")), 0);
}

TEST_F(DeviceLocalizationTest, AnAbsentTextComesFirst) {
    EXPECT_LT(localization().localizedStandardCompare(Text(), Text("")), 0);
    EXPECT_GT(localization().localizedStandardCompare(Text("a"), Text()), 0);
    EXPECT_EQ(localization().localizedStandardCompare(Text(), Text()), 0);
}

TEST_F(DeviceLocalizationTest, CountsFollowThePluralsOfTheLanguage) {
    const std::int64_t one = 1;
    const std::int64_t two = 2;
    const std::int64_t many = 1234;
    const Text german("{0, plural, one {# App} other {# Apps}}");
    EXPECT_EQ(formatted("de-DE", german, {one}), "1 App");
    EXPECT_EQ(formatted("de-DE", german, {many}), "1.234 Apps");
    const Text french("{0, plural, one {# app} other {# apps}}");
    EXPECT_EQ(formatted("fr", french, {std::int64_t{0}}), "0 app");
    EXPECT_EQ(formatted("fr", french, {two}), "2 apps");
    EXPECT_EQ(formatted("ja", "{0, plural, other {#個}}", {one}), "1個");
    const Text arabic("{0, plural, zero {none} one {single} two {pair} few {# few} many {# many} "
                      "other {# other}}");
    EXPECT_EQ(formatted("ar", arabic, {std::int64_t{0}}), "none");
    EXPECT_EQ(formatted("ar", arabic, {one}), "single");
    EXPECT_EQ(formatted("ar", arabic, {two}), "pair");
    EXPECT_EQ(formatted("ar-EG", arabic, {std::int64_t{3}}), "٣ few");
    EXPECT_EQ(formatted("ar", arabic, {std::int64_t{11}}), "١١ many");
}

TEST_F(DeviceLocalizationTest, TextsStandWhereTheirNumberIs) {
    EXPECT_EQ(formatted("en", "{1} and {0}", {Text("a"), Text("b {0}")}), "b {0} and a");
    EXPECT_EQ(formatted("en", "[{0}]", {Text()}), "[]");
    EXPECT_EQ(formatted("en", "It''s {0}", {Text("me")}), "It's me");
}

TEST_F(DeviceLocalizationTest, DatesAreShownInTheDevicesTimeZone) {
    // 2024-03-05T20:07:09Z is the next morning in Tokyo.
    const Date date = Date(std::chrono::seconds(1709669229));
    EXPECT_EQ(formatted("en-US", "{0, date, short}", {date}), "3/6/24");
    EXPECT_EQ(formatted("de-DE", "{0, date, short}", {date}), "06.03.24");
    EXPECT_EQ(formatted("de-DE", "{1}: {0, time, short}", {date, Text("um")}), "um: 05:07");
    EXPECT_EQ(formatted("de-DE", "{0, date, ::yMMMdjmm}", {date}), "6. März 2024, 05:07");
    EXPECT_EQ(formatted("de-DE", "{0}", {date}), "06.03.24, 05:07");
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceLocalizationTest, AFormatWithoutPlaceholdersIsTheVeryObject) {
    for (const char* const words : {"It's plain, isn''t it", "", "100 %", "a '{' alone"}) {
        const Text format(words);
        EXPECT_TRUE(localization()
                        .stringWithFormatLocaleArguments(format, {"en"}, {})
                        .isSameObjectAs(format))
            << words;
    }
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceLocalizationTest, AFormatThatCannotBeFilledComesBackWithALine) {
    const Date date;
    EXPECT_EQ(formatted("en", "an {0 open one", {Text("x")}), "an {0 open one");
    EXPECT_EQ(formatted("en", "{0} {1}", {Text("x")}), "{0} {1}");
    EXPECT_EQ(formatted("en", "{name}", {Text("x")}), "{name}");
    const std::string nested = "{1, plural, other {{0, time}}}";
    EXPECT_EQ(formatted("en", nested, {date, std::int64_t{2}}), nested);
    EXPECT_EQ(formatted("en", "{0, date, short}", {Text("x")}), "{0, date, short}");

    const std::string start = "Can't fill the format ";
    EXPECT_EQ(log().lines(),
              (std::vector<std::string>{
                  start + R"("an {0 open one": malformed near character 5)",
                  start + R"("{0} {1}": there is no argument 1)",
                  start + R"("{name}": a placeholder has a name where a number was expected)",
                  start + "\"" + nested + "\": a date stands inside another placeholder",
                  start + R"("{0, date, short}": U_ILLEGAL_ARGUMENT_ERROR)"}));
}

TEST_F(DeviceLocalizationTest, AFaultOfAFormatThatIsUsedOftenIsLoggedOnce) {
    for (int use = 0; use < 3; ++use) {
        EXPECT_EQ(formatted("en", "{0} {1}", {Text("x")}), "{0} {1}");
    }
    EXPECT_EQ(formatted("en", "{0} {2}", {Text("x")}), "{0} {2}");

    const std::string start = "Can't fill the format ";
    EXPECT_EQ(log().lines(),
              (std::vector<std::string>{start + R"("{0} {1}": there is no argument 1)",
                                        start + R"("{0} {2}": there is no argument 2)"}));
}

// The last second of 2023 in Tokyo, where the device is.
constexpr Date newYearsEve =
    std::chrono::sys_days(std::chrono::December / 31 / 2023) + std::chrono::seconds(53999);

TEST_F(DeviceLocalizationTest, ADateIsWrittenByItsPatternInTheDevicesTimeZone) {
    const auto formatter = localization().dateFormatterWithFormat("yy.MM.dd-HH.mm.ss");

    EXPECT_EQ(formatter->stringFromDate(newYearsEve), Text("23.12.31-23.59.59"));
    EXPECT_EQ(formatter->stringFromDate(newYearsEve + std::chrono::microseconds(999'999)),
              Text("23.12.31-23.59.59"));
    EXPECT_EQ(formatter->stringFromDate(newYearsEve + std::chrono::seconds(1)),
              Text("24.01.01-00.00.00"));
    EXPECT_EQ(formatter->stringFromDate(Date(std::chrono::microseconds(-1))),
              Text("70.01.01-08.59.59"));
}

TEST_F(DeviceLocalizationTest, ADateIsWrittenByTheLocaleOfWhenTheFormatterWasMade) {
    const auto english = localization().dateFormatterWithFormat("MMMM d");
    settings().overrideLocale("de-DE");
    const auto german = localization().dateFormatterWithFormat("d. MMMM");
    settings().overrideLocale("ar-EG");
    const auto arabic = localization().dateFormatterWithFormat("dd");

    EXPECT_EQ(english->stringFromDate(newYearsEve), Text("December 31"));
    EXPECT_EQ(german->stringFromDate(newYearsEve), Text("31. Dezember"));
    EXPECT_EQ(arabic->stringFromDate(newYearsEve), Text("\u0663\u0661"));
}

TEST_F(DeviceLocalizationTest, APatternWithAFieldThatDoesNotExistWritesNothing) {
    EXPECT_EQ(localization().dateFormatterWithFormat("yy n")->stringFromDate(newYearsEve), Text());
    EXPECT_EQ(localization().dateFormatterWithFormat(Text())->stringFromDate(newYearsEve),
              Text(""));
}

} // namespace
} // namespace nimbra::device
