#include "device/system/DevicePreferences.h"

#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

class DevicePreferencesTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path directory() const {
        return _directory.path() / "var/lib/nimbra/preferences";
    }
    void write(const std::string& domain, const std::string& text) const {
        test::writeTestFile(directory() / (domain + ".json"), text);
    }
    [[nodiscard]] DevicePaths paths() const { return DevicePaths(_directory.path()); }
    [[nodiscard]] const DevicePreferences& preferences() const { return _preferences; }
    [[nodiscard]] const test::RecordingLog& log() const { return _log; }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    DevicePreferences _preferences{DevicePaths(_directory.path()), _log};
};

TEST_F(DevicePreferencesTest, AnIntegerIsReadAsTheFileHasItNow) {
    write("domain", R"({"level": 3})");
    EXPECT_EQ(preferences().appIntegerValueForKeyInDomain("level", "domain"), 3);

    write("domain", R"({"level": -9223372036854775808})");
    EXPECT_EQ(preferences().appIntegerValueForKeyInDomain("level", "domain"), INT64_MIN);
}

TEST_F(DevicePreferencesTest, AnythingElseIsNoInteger) {
    write("domain", R"({"true": true, "float": 7.5, "whole": 7.0, "text": "7", "fraction": "7.5",
                        "word": "seven", "null": null, "large": 9223372036854775808,
                        "list": [7], "object": {"7": 7}})");

    for (const char* const key : {"true", "float", "whole", "text", "fraction", "word", "null",
                                  "large", "list", "object", "no"}) {
        EXPECT_EQ(preferences().appIntegerValueForKeyInDomain(key, "domain"), std::nullopt) << key;
    }
    EXPECT_EQ(preferences().appIntegerValueForKeyInDomain("key", "no such domain"), std::nullopt);
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DevicePreferencesTest, AFileThatCannotBeReadMeansNothingAndOneLine) {
    write("domain", "[1]");

    EXPECT_EQ(preferences().appIntegerValueForKeyInDomain("key", "domain"), std::nullopt);

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{"/var/lib/nimbra/preferences/domain.json"
                                       ": /: expected an object of keys and values, found [1]"});
}

TEST_F(DevicePreferencesTest, APipeIsNotWaitedFor) {
    std::filesystem::create_directories(directory());
    ASSERT_EQ(::mkfifo((directory() / "domain.json").c_str(), 0644), 0);
    const std::string problem = ": is not a plain file";

    EXPECT_EQ(preferences().appIntegerValueForKeyInDomain("key", "domain"), std::nullopt);
    const auto checked = checkPreferences(paths());

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{"/var/lib/nimbra/preferences/domain.json" + problem});
    ASSERT_FALSE(checked);
    EXPECT_EQ(checked.error().description, (directory() / "domain.json").string() + problem);
}

TEST_F(DevicePreferencesTest, ACheckFollowsALinkAsTheDeviceWould) {
    test::writeTestFile(paths().root() / "etc/domain.json", "{}");
    std::filesystem::create_directories(directory());
    std::filesystem::create_symlink("/etc/domain.json", directory() / "domain.json");

    EXPECT_TRUE(checkPreferences(paths()));
}

TEST_F(DevicePreferencesTest, ACheckNamesTheFileThatCannotBeRead) {
    const auto missing = checkPreferences(paths());
    write("good", R"({"a": 1})");
    const auto good = checkPreferences(paths());
    write("bad", "{");
    const auto bad = checkPreferences(paths());

    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.error().description,
              directory().string() + ": cannot be read: No such file or directory");
    EXPECT_TRUE(good);
    ASSERT_FALSE(bad);
    EXPECT_TRUE(bad.error().description.starts_with((directory() / "bad.json").string() +
                                                    ": line 1, column 2: not JSON: "));
}

} // namespace
} // namespace nimbra::device
