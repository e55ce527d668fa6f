#pragma once

#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "device/system/DeviceSettings.h"
#include "platform/system/ClassRegistry.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::device {

/// Bundles in a directory of the test's own, and what they are loaded with.
class BundlesFixture : public testing::Test {
protected:
    BundlesFixture() : _settings(openSettings()) {}

    [[nodiscard]] std::filesystem::path folder() const { return _directory.path() / "A.bundle"; }
    [[nodiscard]] DevicePaths paths() const { return DevicePaths(_directory.path() / "device"); }
    [[nodiscard]] DeviceSettings& settings() { return _settings; }
    [[nodiscard]] DeviceBundles& bundles() { return _bundles; }
    [[nodiscard]] ClassRegistry& classes() { return _classes; }
    /// What the log was told.
    [[nodiscard]] test::RecordingLog& log() { return _log; }

    /// A whole bundle in `folder`, whose shared object is the test's `object`.
    static void makeBundle(const std::filesystem::path& folder,
                           const std::string& object = "test-object-first",
                           const std::string& identifier = "com.example.a",
                           const std::string& principalClass = "FirstController") {
        test::writeTestFile(folder / "manifest.json",
                            R"({"identifier": ")" + identifier +
                                R"(", "executable": "A.so", "principalClass": ")" + principalClass +
                                R"(", "developmentLanguage": "en"})");
        std::filesystem::copy_file(std::filesystem::path(NIMBRA_TEST_OBJECTS) / (object + ".so"),
                                   folder / "A.so",
                                   std::filesystem::copy_options::overwrite_existing);
    }

    void writeTable(const std::string& language, const std::string& text,
                    const std::string& table = "Localizable") const {
        test::writeTestFile(folder() / language / (table + ".json"), text);
    }

    [[nodiscard]] std::shared_ptr<DeviceBundle> load() {
        auto bundle = _bundles.load(folder());
        EXPECT_TRUE(bundle) << bundle.error();
        return *bundle;
    }

    [[nodiscard]] std::string failureOf(const std::filesystem::path& path) {
        const auto bundle = _bundles.load(path);
        return bundle ? "no error" : bundle.error().description;
    }

private:
    [[nodiscard]] DeviceSettings openSettings() const {
        test::writeTestFile(_directory.path() / "device/var/lib/nimbra/device.json", "{}");
        return DeviceSettings::open(_directory.path() / "device").value();
    }

    test::TemporaryDirectory _directory;
    DeviceSettings _settings;
    ClassRegistry _classes;
    test::RecordingLog _log;
    DeviceBundles _bundles{paths(), _settings, _classes, _log};
};

} // namespace nimbra::device
