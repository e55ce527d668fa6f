#include "device/DeviceDirectory.h"
#include "device/description/DatabaseSettings.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {
namespace {

using test::contentOf;
using test::treeOf;
using test::writeTestFile;
using testing::StartsWith;

/// Devices with and without the settings bundle of the cloud database.
class DeviceDirectoryDatabaseTest : public testing::Test {
protected:
    DeviceDirectoryDatabaseTest() {
        writeTestFile(source() / "manifest.json", "{}");
        writeTestFile(source() / "TessarySettings.so", std::string("code\0more", 9));
        writeTestFile(source() / "en/Localizable.json", R"({"KEY": "text"})");
    }

    [[nodiscard]] std::filesystem::path place() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path root() const { return place() / "device"; }
    [[nodiscard]] std::filesystem::path source() const { return place() / "source"; }
    [[nodiscard]] std::filesystem::path bundle() const {
        return root() / "System/Library/PreferenceBundles/AccountSettings/TessarySettings.bundle";
    }

    [[nodiscard]] static DeviceDescription withGroups(std::int64_t count) {
        DeviceDescription description;
        description.databaseSettings = {.numAppGroups = count};
        return description;
    }
    void create(const DeviceDescription& description) const {
        const auto created =
            createDeviceDirectory(root(), description, {.databaseBundle = source()});
        ASSERT_TRUE(created) << created.error();
    }
    [[nodiscard]] std::expected<void, Error> change(const DeviceDescription& description) const {
        return changeDeviceDirectory(root(), {description, {"databaseSettings"}},
                                     {.databaseBundle = source()});
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceDirectoryDatabaseTest, TheBundleIsCopiedAndTheNumberStandsBesideIt) {
    create(withGroups(2147483648));

    auto expected = treeOf(source());
    expected["app-groups.json"] = "{\n  \"numAppGroups\": 2147483648\n}\n";
    EXPECT_EQ(treeOf(bundle()), expected);
}

TEST_F(DeviceDirectoryDatabaseTest, WithoutTheSettingsThereIsNoBundle) {
    create({});

    EXPECT_FALSE(std::filesystem::exists(root() / "System"));
}

TEST_F(DeviceDirectoryDatabaseTest, AChangeBringsTheBundleAndTakesItAway) {
    create({});

    ASSERT_TRUE(change(withGroups(1)));
    EXPECT_EQ(contentOf(bundle() / "app-groups.json"), "{\n  \"numAppGroups\": 1\n}\n");
    EXPECT_TRUE(std::filesystem::exists(bundle() / "TessarySettings.so"));

    ASSERT_TRUE(change({}));
    EXPECT_FALSE(std::filesystem::exists(bundle()));
    ASSERT_TRUE(change({}));
}

TEST_F(DeviceDirectoryDatabaseTest, AChangedNumberLeavesTheCodeInUseAsItIs) {
    create(withGroups(1));
    // What a process has loaded is this file, whatever comes under its name.
    std::filesystem::create_hard_link(bundle() / "TessarySettings.so", place() / "in use");
    const std::string code = contentOf(place() / "in use");
    writeTestFile(source() / "TessarySettings.so", "other code");

    ASSERT_TRUE(change(withGroups(2)));

    EXPECT_EQ(contentOf(bundle() / "app-groups.json"), "{\n  \"numAppGroups\": 2\n}\n");
    EXPECT_EQ(contentOf(bundle() / "TessarySettings.so"), "other code");
    EXPECT_EQ(contentOf(place() / "in use"), code);
}

TEST_F(DeviceDirectoryDatabaseTest, AChangeOfSomethingElseLeavesTheBundle) {
    create(withGroups(1));
    const auto before = treeOf(bundle());

    ASSERT_TRUE(changeDeviceDirectory(root(), {{}, {"name"}}));

    EXPECT_EQ(treeOf(bundle()), before);
}

TEST_F(DeviceDirectoryDatabaseTest, ABundleThatIsNotThereToBeCopiedIsReportedAndNothingIsMade) {
    std::filesystem::remove_all(source());

    const auto created = createDeviceDirectory(root(), withGroups(1), {.databaseBundle = source()});

    ASSERT_FALSE(created);
    EXPECT_EQ(created.error().description,
              source().string() + ": the settings bundle of the cloud database cannot be read: No "
                                  "such file or directory");
    EXPECT_TRUE(treeOf(place()).empty());
    const auto unknown = createDeviceDirectory(root(), withGroups(1));
    ASSERT_FALSE(unknown);
    EXPECT_EQ(unknown.error().description,
              "TessarySettings.bundle: the settings bundle of the cloud database cannot be read: "
              "No such file or directory");
    EXPECT_TRUE(treeOf(place()).empty());
}

TEST_F(DeviceDirectoryDatabaseTest, AFolderThatCannotBeMadeIsReported) {
    create({});
    writeTestFile(root() / "System/Library", "a file");

    const auto changed = change(withGroups(1));

    ASSERT_FALSE(changed);
    EXPECT_THAT(changed.error().description, StartsWith((root() / "System/Library").string()));
    EXPECT_EQ(contentOf(root() / "System/Library"), "a file");
}

TEST_F(DeviceDirectoryDatabaseTest, AFileThatCannotBeWrittenIsReported) {
    create(withGroups(1));
    std::filesystem::remove(bundle() / "app-groups.json");
    std::filesystem::create_directories(bundle() / "app-groups.json/taken");

    const auto changed = change(withGroups(2));

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description,
              (bundle() / "app-groups.json").string() + ": cannot be written: Is a directory");
}

TEST_F(DeviceDirectoryDatabaseTest, ABundleThatCannotBeRemovedIsReported) {
    create(withGroups(1));
    for (const auto& folder : {place(), root()}) {
        std::filesystem::permissions(folder, std::filesystem::perms(0755));
    }
    std::expected<void, Error> changed;
    {
        const test::ReadOnly readOnly(bundle() / "en");
        changed = replaceDatabaseSettings(DevicePaths(root()), std::nullopt, {});
    }

    ASSERT_FALSE(changed);
    EXPECT_EQ(changed.error().description,
              bundle().string() + ": cannot be removed: Permission denied");
    EXPECT_TRUE(std::filesystem::exists(bundle() / "en/Localizable.json"));
}

} // namespace
} // namespace nimbra::device
