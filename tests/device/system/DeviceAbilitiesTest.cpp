#include "device/system/DeviceAbilities.h"

#include "device/DeviceDirectory.h"
#include "device/system/DeviceRestrictions.h"
#include "device/system/DeviceSettings.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

struct DeviceAbilitiesTest : testing::Test {
    test::TemporaryDirectory directory;
    test::RecordingLog log;
    DeviceDescription description;

    [[nodiscard]] std::filesystem::path root() const { return directory.path() / "device"; }

    [[nodiscard]] DeviceSettings settings() const {
        EXPECT_TRUE(createDeviceDirectory(root(), description));
        auto opened = DeviceSettings::open(root());
        EXPECT_TRUE(opened);
        return *opened;
    }
};

TEST_F(DeviceAbilitiesTest, CellularDataIsAnsweredFromTheDevicesFile) {
    description.cellularData = false;
    const DeviceSettings without = settings();
    EXPECT_FALSE(DeviceAbilities(without).boolAnswerForQuestion("cellular-data"));

    description.cellularData = true;
    ASSERT_TRUE(changeDeviceDirectory(root(), {description, {"cellularData"}}));
    auto with = DeviceSettings::open(root());
    ASSERT_TRUE(with);
    EXPECT_TRUE(DeviceAbilities(*with).boolAnswerForQuestion("cellular-data"));
}

TEST_F(DeviceAbilitiesTest, AQuestionThatIsNotKnownIsAnsweredWithNo) {
    const DeviceSettings made = settings();

    EXPECT_FALSE(DeviceAbilities(made).boolAnswerForQuestion("time-travel"));
}

TEST_F(DeviceAbilitiesTest, TheUsersNameForTheDeviceIsThatOfItsFile) {
    description.name = " Lab\u2019s \"Pad\" / 2";
    const DeviceSettings named = settings();
    EXPECT_EQ(DeviceAbilities(named).copyAnswerForQuestion("UserAssignedDeviceName"),
              Text(description.name));

    ASSERT_TRUE(changeDeviceDirectory(root(), {DeviceDescription(), {"name"}}));
    auto renamed = DeviceSettings::open(root());
    ASSERT_TRUE(renamed);
    EXPECT_EQ(DeviceAbilities(*renamed).copyAnswerForQuestion("UserAssignedDeviceName"),
              Text("Nimbra Phone"));
}

TEST_F(DeviceAbilitiesTest, AQuestionForWordsThatIsNotKnownHasNoAnswer) {
    const DeviceSettings made = settings();

    for (const Text& question : {Text("SerialNumber"), Text("userassigneddevicename"), Text()}) {
        EXPECT_EQ(DeviceAbilities(made).copyAnswerForQuestion(question), Text()) << question;
    }
}

TEST_F(DeviceAbilitiesTest, AKeyStaysAsItIsOnADeviceWithTheUsualWording) {
    const DeviceSettings made = settings();

    EXPECT_EQ(DeviceAbilities(made).VariantStringKeyForKey("KEY"), Text("KEY"));
}

TEST_F(DeviceAbilitiesTest, AVariantsNameIsPutBehindTheKey) {
    description.wirelessVariant = "WLAN";
    const DeviceSettings made = settings();

    EXPECT_EQ(DeviceAbilities(made).VariantStringKeyForKey("KEY"), Text("KEY_WLAN"));
}

TEST_F(DeviceAbilitiesTest, TheIdiomIsThatOfTheDevicesFile) {
    const DeviceSettings phone = settings();
    EXPECT_EQ(DeviceAbilities(phone).userInterfaceIdiom(), UserInterfaceIdiom::phone);

    description.idiom = "pad";
    ASSERT_TRUE(changeDeviceDirectory(root(), {description, {"idiom"}}));
    auto pad = DeviceSettings::open(root());
    ASSERT_TRUE(pad);
    EXPECT_EQ(DeviceAbilities(*pad).userInterfaceIdiom(), UserInterfaceIdiom::pad);
}

TEST_F(DeviceAbilitiesTest, TheMainScreenIsThatOfTheDevicesFile) {
    description.screen = {.width = 820, .height = 1180.5, .scale = 3};
    const DeviceSettings made = settings();

    EXPECT_EQ(DeviceAbilities(made).mainScreen(),
              (Screen{.bounds = {.origin = {}, .size = {820, 1180.5}}, .scale = 3}));
}

TEST_F(DeviceAbilitiesTest, ADeviceMayHaveNoMainScreen) {
    description.screen = std::nullopt;
    const DeviceSettings made = settings();

    EXPECT_EQ(DeviceAbilities(made).mainScreen(), std::nullopt);
}

TEST_F(DeviceAbilitiesTest, RestrictionsFollowAChangeOfTheDevice) {
    static_cast<void>(settings());
    const DeviceRestrictions restrictions(DevicePaths(root()), log);
    EXPECT_TRUE(restrictions.isAppCellularDataModificationAllowed());

    description.appCellularDataModificationAllowed = false;
    ASSERT_TRUE(changeDeviceDirectory(root(), {description, {"restrictions"}}));

    EXPECT_FALSE(restrictions.isAppCellularDataModificationAllowed());
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceAbilitiesTest, RestrictionsThatCannotBeReadAllowNothingAndSaySo) {
    static_cast<void>(settings());
    const DeviceRestrictions restrictions(DevicePaths(root()), log);
    test::writeTestFile(root() / "var/lib/nimbra/restrictions.json", "{");

    EXPECT_FALSE(restrictions.isAppCellularDataModificationAllowed());
    EXPECT_EQ(log.lines().size(), 1U);
}

} // namespace
} // namespace nimbra::device
