#include "device/system/DeviceSettings.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

class DeviceSettingsTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path path() const {
        return root() / "var/lib/nimbra/device.json";
    }
    [[nodiscard]] const std::filesystem::path& root() const { return _directory.path(); }
    void write(const std::string& text) const { test::writeTestFile(path(), text); }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceSettingsTest, TheyAreThoseOfTheFile) {
    write(R"({"locale": "de-AT", "timeZone": "Europe/Vienna"})");

    const auto settings = DeviceSettings::open(root());

    ASSERT_TRUE(settings) << settings.error();
    EXPECT_EQ(settings->localeIdentifier(), "de-AT");
    EXPECT_EQ(settings->timeZone(), "Europe/Vienna");
}

TEST_F(DeviceSettingsTest, WhatTheFileLeavesOutHasItsDefault) {
    write("{}");

    const auto settings = DeviceSettings::open(root());

    ASSERT_TRUE(settings) << settings.error();
    EXPECT_EQ(settings->localeIdentifier(), "en-US");
    EXPECT_EQ(settings->timeZone(), "UTC");
    EXPECT_EQ(settings->userInterfaceIdiom(), UserInterfaceIdiom::phone);
    EXPECT_EQ(settings->mainScreen(),
              (Screen{.bounds = {.origin = {}, .size = {390, 844}}, .scale = 2}));
}

TEST_F(DeviceSettingsTest, AChangeOfTheFileShowsAfterReloading) {
    write(R"({"locale": "de"})");
    auto settings = DeviceSettings::open(root());
    write(R"({"locale": "fr"})");
    EXPECT_EQ(settings->localeIdentifier(), "de");

    ASSERT_TRUE(settings->reload());

    EXPECT_EQ(settings->localeIdentifier(), "fr");
}

TEST_F(DeviceSettingsTest, AnotherKindOfDeviceAndScreenShowAfterReloading) {
    write(R"({"idiom": "pad", "screen": {"width": 820, "height": 1180}})");
    auto settings = DeviceSettings::open(root());
    const Screen large{.bounds = {.origin = {}, .size = {820, 1180}}, .scale = 2};
    write(R"({"screen": null})");
    EXPECT_EQ(settings->userInterfaceIdiom(), UserInterfaceIdiom::pad);
    EXPECT_EQ(settings->mainScreen(), large);

    ASSERT_TRUE(settings->reload());
    EXPECT_EQ(settings->userInterfaceIdiom(), UserInterfaceIdiom::phone);
    EXPECT_EQ(settings->mainScreen(), std::nullopt);

    write(R"({"screen": {"scale": 1.5}})");
    ASSERT_TRUE(settings->reload());
    EXPECT_EQ(settings->mainScreen(),
              (Screen{.bounds = {.origin = {}, .size = {390, 844}}, .scale = 1.5}));

    write(R"({"idiom": "watch", "screen": null})");
    EXPECT_FALSE(settings->reload());
    EXPECT_EQ(settings->userInterfaceIdiom(), UserInterfaceIdiom::phone);
    EXPECT_TRUE(settings->mainScreen());
}

TEST_F(DeviceSettingsTest, AReloadThatFailsChangesNothing) {
    write(R"({"locale": "de", "timeZone": "Asia/Tokyo"})");
    auto settings = DeviceSettings::open(root());
    write(R"({"locale": "fr", "timeZone": 7})");

    const auto reloaded = settings->reload();

    ASSERT_FALSE(reloaded);
    EXPECT_TRUE(reloaded.error().description.starts_with(path().string() + ": /timeZone: "));
    EXPECT_EQ(settings->localeIdentifier(), "de");
    EXPECT_EQ(settings->timeZone(), "Asia/Tokyo");
}

TEST_F(DeviceSettingsTest, AnOverridingLocaleOutlivesAReload) {
    write(R"({"locale": "de"})");
    auto settings = DeviceSettings::open(root());

    settings->overrideLocale("ja");
    ASSERT_TRUE(settings->reload());

    EXPECT_EQ(settings->localeIdentifier(), "ja");
}

TEST_F(DeviceSettingsTest, AFileThatCannotBeReadIsAnError) {
    const auto missing = DeviceSettings::open(root());
    write(R"(["locale"])");
    const auto wrong = DeviceSettings::open(root());
    write(R"({"colour": 1})");
    const auto unknown = DeviceSettings::open(root());

    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.error().description,
              path().string() + ": cannot be read: No such file or directory");
    ASSERT_FALSE(wrong);
    EXPECT_EQ(wrong.error().description,
              path().string() + ": /: expected an object, found [\"locale\"]");
    ASSERT_FALSE(unknown);
    EXPECT_EQ(unknown.error().description,
              path().string() + ": /colour: unknown key; expected one of name, idiom, screen, "
                                "locale, timeZone, abilities");
}

} // namespace
} // namespace nimbra::device
