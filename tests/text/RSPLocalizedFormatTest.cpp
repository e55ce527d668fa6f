#include "support/RSPLocalizedFormat.h"

#include "tests/support/FakeBundle.h"
#include "tests/support/FakeLocalization.h"
#include "tests/support/SyslogCapture.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra {
namespace {

struct RSPLocalizedFormatTest : testing::Test {
    test::SyslogCapture syslog;
    test::FakeLocalization localization;
    std::shared_ptr<Bundle> bundle = std::make_shared<test::FakeBundle>(
        std::map<std::string, Text>{{"CLOUD_DRIVE_NUM_APPS", "{0} apps"}});
};

TEST_F(RSPLocalizedFormatTest, TheFormatIsFilledInWithTheUsersCurrentLocale) {
    const Text text = RSPLocalizedFormat("CLOUD_DRIVE_NUM_APPS", "Localizable", bundle,
                                         localization, {std::int64_t{7}});

    EXPECT_EQ(text, Text("7 apps"));
    EXPECT_EQ(localization.locales, std::vector<Locale>({{"de-DE"}}));
}

TEST_F(RSPLocalizedFormatTest, AMissingFormatGivesTheStandInWhateverTheArguments) {
    const Text text =
        RSPLocalizedFormat("MISSING", "Localizable", bundle, localization, {std::int64_t{7}});

    EXPECT_EQ(text, Text("RSP_LOCALIZED_STRING_UNAVAILABLE"));
    EXPECT_EQ(syslog.lines.size(), 1U);
}

TEST_F(RSPLocalizedFormatTest, WithoutABundleThereIsNoTextAndNoLine) {
    const Text text = RSPLocalizedFormat("CLOUD_DRIVE_NUM_APPS", "Localizable", nullptr,
                                         localization, {std::int64_t{7}});

    EXPECT_EQ(text, Text());
    EXPECT_TRUE(syslog.lines.empty());
}

} // namespace
} // namespace nimbra
