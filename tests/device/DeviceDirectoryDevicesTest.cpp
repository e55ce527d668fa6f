#include "device/DeviceDirectory.h"
#include "device/description/DescriptionFiles.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {
namespace {

using test::contentOf;
using test::treeOf;
using test::writeTestFile;

class DeviceDirectoryDevicesTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::filesystem::path file() const {
        return root() / "var/lib/nimbra/device-list.json";
    }

    void create(const DeviceDescription& description = {}) const {
        const auto created = createDeviceDirectory(root(), description);
        ASSERT_TRUE(created) << created.error();
    }
    void change(const GivenDescription& given) const {
        const auto changed = changeDeviceDirectory(root(), given);
        ASSERT_TRUE(changed) << changed.error();
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceDirectoryDevicesTest, AListOfDevicesIsReadAsItWasWritten) {
    using Outcome = DeviceDescription::DeviceList::Outcome;
    create();
    for (const Outcome outcome : {Outcome::answers, Outcome::fails, Outcome::neverAnswers}) {
        GivenDescription given;
        given.keys = {"deviceList"};
        given.description.deviceList = {.incompatible = {"b", "", "a\n"},
                                        .needUpgrade = {"ü"},
                                        .outcome = outcome,
                                        .delay = 0.25};
        change(given);

        const auto read = readDescriptionFile(DevicePaths(root()), deviceListFile);

        ASSERT_TRUE(read) << read.error();
        EXPECT_EQ(read->deviceList.incompatible, given.description.deviceList.incompatible);
        EXPECT_EQ(read->deviceList.needUpgrade, given.description.deviceList.needUpgrade);
        EXPECT_EQ(read->deviceList.outcome, outcome);
        EXPECT_EQ(read->deviceList.delay, 0.25);
    }
}

TEST_F(DeviceDirectoryDevicesTest, AChangeOfTheListOfDevicesReplacesItAndNothingElse) {
    DeviceDescription description;
    description.deviceList = {.incompatible = {"old"}, .needUpgrade = {"old"}};
    create(description);
    auto expected = treeOf(root());
    GivenDescription other;
    other.keys = {"name"};
    change(other);
    EXPECT_EQ(treeOf(root()), expected);

    GivenDescription given;
    given.keys = {"deviceList"};
    given.description.deviceList.needUpgrade = {"new"};
    change(given);

    const std::string name = "var/lib/nimbra/device-list.json";
    auto changed = treeOf(root());
    EXPECT_EQ(nlohmann::json::parse(changed[name])["incompatible"].size(), 0U);
    EXPECT_EQ(nlohmann::json::parse(changed[name])["needUpgrade"], nlohmann::json{"new"});
    expected.erase(name);
    changed.erase(name);
    EXPECT_EQ(changed, expected);
}

TEST_F(DeviceDirectoryDevicesTest, AListOfDevicesThatCannotBeWrittenIsReported) {
    create();
    std::filesystem::remove(file());
    std::filesystem::create_directories(file() / "taken");
    GivenDescription given;
    given.keys = {"deviceList"};

    const auto changed = changeDeviceDirectory(root(), given);

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description, file().string() + ": cannot be written: Is a directory");
}

TEST_F(DeviceDirectoryDevicesTest, ABrokenListOfDevicesIsReplacedByAChange) {
    create();
    writeTestFile(file(), "{");
    GivenDescription given;
    given.keys = {"deviceList"};
    given.description.deviceList.needUpgrade = {"new"};

    change(given);

    EXPECT_TRUE(contentOf(file()).contains("new"));
}

} // namespace
} // namespace nimbra::device
