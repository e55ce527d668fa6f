#include "device/description/MachineFacts.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using test::writeTestFile;

struct MachineFactsTest : testing::Test {
    test::TemporaryDirectory root;
};

TEST_F(MachineFactsTest, TheNameIsThePrettyHostName) {
    writeTestFile(root.path() / "etc/hostname", "phone\n");
    writeTestFile(root.path() / "etc/machine-info",
                  "CHASSIS=handset\nPRETTY_HOSTNAME=\"Lab\u2019s Phone\"\n");

    EXPECT_EQ(describeMachine(root.path()).name, "Lab\u2019s Phone");
}

TEST_F(MachineFactsTest, WithoutAPrettyNameItIsTheHostName) {
    writeTestFile(root.path() / "etc/hostname", "phone\n");

    EXPECT_EQ(describeMachine(root.path()).name, "phone");
}

TEST_F(MachineFactsTest, AMachineThatTellsNothingHasTheUsualName) {
    EXPECT_EQ(describeMachine(root.path()).name, DeviceDescription().name);
}

TEST_F(MachineFactsTest, AMobileBroadbandInterfaceMeansCellularData) {
    writeTestFile(root.path() / "sys/class/net/lo/uevent", "INTERFACE=lo\n");
    writeTestFile(root.path() / "sys/class/net/wlan0/uevent", "DEVTYPE=wlan\nINTERFACE=wlan0\n");
    EXPECT_FALSE(describeMachine(root.path()).cellularData);

    writeTestFile(root.path() / "sys/class/net/wwan0/uevent", "DEVTYPE=wwan\nINTERFACE=wwan0\n");
    EXPECT_TRUE(describeMachine(root.path()).cellularData);
}

TEST_F(MachineFactsTest, WithoutInterfacesThereIsNoCellularData) {
    EXPECT_FALSE(describeMachine(root.path()).cellularData);
}

TEST_F(MachineFactsTest, TheLocaleAndTheTimeZoneAreTheProcesss) {
    const DeviceDescription description = describeMachine(root.path());

    EXPECT_FALSE(description.locale.empty());
    EXPECT_FALSE(description.timeZone.empty());
}

} // namespace
} // namespace nimbra::device
