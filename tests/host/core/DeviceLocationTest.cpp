#include "host/core/DeviceLocation.h"

#include "device/files/Files.h"
#include "tests/device/TestFiles.h"
#include "tests/support/EnvironmentVariable.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <optional>
#include <pwd.h>
#include <string>
#include <unistd.h>

namespace nimbra::host {
namespace {

TEST(DeviceLocation, TheStateStandsWhereTheEnvironmentSays) {
    const test::EnvironmentVariable home("HOME", "/users/somebody");
    test::EnvironmentVariable state("XDG_STATE_HOME", "/state");
    EXPECT_EQ(stateDirectory(), "/state/nimbra");
    EXPECT_EQ(defaultDeviceDirectory(), "/state/nimbra/device");

    // A relative one does not count.
    state.set("state");
    EXPECT_EQ(stateDirectory(), "/users/somebody/.local/state/nimbra");

    state.set(std::nullopt);
    EXPECT_EQ(defaultDeviceDirectory(), "/users/somebody/.local/state/nimbra/device");
}

TEST(DeviceLocation, WithoutAHomeInTheEnvironmentTheSystemKnowsTheUsers) {
    const test::EnvironmentVariable state("XDG_STATE_HOME", std::nullopt);
    const std::filesystem::path known = ::getpwuid(::getuid())->pw_dir;
    ASSERT_TRUE(known.is_absolute());

    for (const std::optional<std::string>& value :
         {std::optional<std::string>(), std::optional<std::string>(""),
          std::optional<std::string>("here")}) {
        const test::EnvironmentVariable home("HOME", value);
        EXPECT_EQ(stateDirectory(), known / ".local/state/nimbra") << value.value_or("(none)");
    }
}

TEST(DeviceLocation, TheSampleDeviceIsMadeWhereNothingIs) {
    const test::TemporaryDirectory directory;
    const auto root = directory.path() / "above/device";

    const auto made = provideDevice(root);
    ASSERT_TRUE(made) << made.error();
    EXPECT_TRUE(*made);
    EXPECT_TRUE(std::filesystem::exists(root / "var/lib/nimbra"));

    const auto again = provideDevice(root);
    ASSERT_TRUE(again) << again.error();
    EXPECT_FALSE(*again);
}

TEST(DeviceLocation, WhatIsThereStaysAsItIs) {
    const test::TemporaryDirectory directory;
    test::writeTestFile(directory.path() / "letter", "dear");
    std::filesystem::create_symlink("nowhere", directory.path() / "link");

    EXPECT_EQ(provideDevice(directory.path() / "letter").value(), false);
    EXPECT_EQ(provideDevice(directory.path() / "link").value(), false);

    EXPECT_EQ(device::readFile(directory.path() / "letter"), "dear");
    EXPECT_EQ(std::filesystem::read_symlink(directory.path() / "link"), "nowhere");
}

TEST(DeviceLocation, ADeviceThatCannotBeMadeIsAnError) {
    const test::TemporaryDirectory directory;
    test::writeTestFile(directory.path() / "file", "");

    const auto made = provideDevice(directory.path() / "file/device");

    ASSERT_FALSE(made);
    EXPECT_NE(made.error().description.find((directory.path() / "file").string()),
              std::string::npos)
        << made.error();
}

TEST(DeviceLocation, ADescriptionThatCannotBeReadIsNamed) {
    const test::TemporaryDirectory directory;
    const auto file = directory.path() / "device.json";
    EXPECT_TRUE(readDescription(file).error().description.starts_with(file.string() + ": "));

    test::writeTestFile(file, R"({"name": 7})");
    EXPECT_TRUE(readDescription(file).error().description.starts_with(file.string() + ": /name: "))
        << readDescription(file).error();

    test::writeTestFile(file, R"({"name": "Lab"})");
    EXPECT_EQ(readDescription(file).value().description.name, "Lab");
}

} // namespace
} // namespace nimbra::host
