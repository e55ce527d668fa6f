#include "support/RSPLocalizedString.h"

#include "tests/device/Threads.h"
#include "tests/support/FakeBundle.h"
#include "tests/support/SyslogCapture.h"

#include <atomic>
#include <gtest/gtest.h>
#include <memory>
#include <mutex>
#include <syslog.h>

namespace nimbra {
namespace {

using Lines = std::vector<std::pair<int, std::string>>;

const char* const kUnavailable = "RSP_LOCALIZED_STRING_UNAVAILABLE";

struct RSPLocalizedStringTest : testing::Test {
    test::SyslogCapture syslog;
    std::shared_ptr<Bundle> bundle = std::make_shared<test::FakeBundle>(std::map<std::string, Text>{
        {"GREETING", "Good day"}, {"ODD", kUnavailable}, {"EMPTY", ""}});
};

TEST_F(RSPLocalizedStringTest, AKeyInTheTableGivesItsText) {
    EXPECT_EQ(RSPLocalizedString("GREETING", "Localizable", bundle), Text("Good day"));
    EXPECT_EQ(RSPLocalizedString("EMPTY", "Localizable", bundle), Text(""));
    EXPECT_EQ(syslog.lines, Lines());
}

TEST_F(RSPLocalizedStringTest, AMissingKeyGivesTheStandInAndOneLine) {
    EXPECT_EQ(RSPLocalizedString("FAREWELL", "Localizable", bundle), Text(kUnavailable));

    EXPECT_EQ(syslog.lines,
              Lines({{LOG_ERR, "Could not find localized string value for key: FAREWELL"}}));
    EXPECT_EQ(LOG_ERR, 3);
}

TEST_F(RSPLocalizedStringTest, EveryLookupOfAMissingKeyIsReported) {
    static_cast<void>(RSPLocalizedString("FAREWELL", "Localizable", bundle));
    static_cast<void>(RSPLocalizedString("FAREWELL", "Localizable", bundle));

    EXPECT_EQ(syslog.lines.size(), 2U);
}

TEST_F(RSPLocalizedStringTest, AKeyIsReportedAsItStands) {
    static_cast<void>(RSPLocalizedString("%s%n Ü", "Localizable", bundle));

    EXPECT_EQ(syslog.lines,
              Lines({{LOG_ERR, "Could not find localized string value for key: %s%n Ü"}}));
}

TEST_F(RSPLocalizedStringTest, AMissingTableIsAMissingKey) {
    EXPECT_EQ(RSPLocalizedString("GREETING", "Another", bundle), Text(kUnavailable));
    EXPECT_EQ(syslog.lines.size(), 1U);
}

TEST_F(RSPLocalizedStringTest, ATextWithTheStandInsWordsIsNoFailure) {
    EXPECT_EQ(RSPLocalizedString("ODD", "Localizable", bundle), Text(kUnavailable));
    EXPECT_EQ(syslog.lines, Lines());
}

TEST_F(RSPLocalizedStringTest, TheStandInIsOneObject) {
    const Text first = RSPLocalizedString("FAREWELL", "Localizable", bundle);
    const Text second = RSPLocalizedString("THANKS", "Localizable", bundle);

    EXPECT_TRUE(first.isSameObjectAs(second));
}

TEST_F(RSPLocalizedStringTest, WithoutABundleThereIsNoTextAndNoLine) {
    EXPECT_EQ(RSPLocalizedString("GREETING", "Localizable", nullptr), Text());
    EXPECT_EQ(syslog.lines, Lines());
}

TEST_F(RSPLocalizedStringTest, AReplacedSinkComesBackToWhoeverReplacesIt) {
    int lines = 0;
    SyslogSink earlier = replaceSyslogSink([&lines](int, const std::string&) { ++lines; });
    static_cast<void>(RSPLocalizedString("FAREWELL", "Localizable", bundle));

    replaceSyslogSink(std::move(earlier));
    static_cast<void>(RSPLocalizedString("THANKS", "Localizable", bundle));

    EXPECT_EQ(lines, 1);
    EXPECT_EQ(syslog.lines.size(), 1U);
}

TEST_F(RSPLocalizedStringTest, ManyThreadsMayLookUpAKeyThatIsMissing) {
    constexpr int rounds = 100;
    std::mutex mutex;
    int lines = 0;
    SyslogSink earlier = replaceSyslogSink([&](int, const std::string&) {
        const std::scoped_lock lock(mutex);
        ++lines;
    });
    const Text standIn = RSPLocalizedString("FAREWELL", "Localizable", bundle);
    std::atomic<int> others = 0;
    const auto lookUp = [&] {
        for (int round = 0; round < rounds; ++round) {
            if (!RSPLocalizedString("FAREWELL", "Localizable", bundle).isSameObjectAs(standIn)) {
                ++others;
            }
        }
    };

    test::runAtOnce({lookUp, lookUp, lookUp, lookUp});

    replaceSyslogSink(std::move(earlier));
    EXPECT_EQ(others, 0);
    EXPECT_EQ(lines, 1 + (4 * rounds));
}

} // namespace
} // namespace nimbra
