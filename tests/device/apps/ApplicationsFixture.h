#pragma once

#include "device/apps/DeviceApplications.h"
#include "device/system/DeviceSettings.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::device {

using Lines = std::vector<std::string>;

/// A device without applications, in a directory, and one outside of it.
class ApplicationsFixture : public testing::Test {
protected:
    ApplicationsFixture() {
        test::writeTestFile(root() / "var/lib/nimbra/device.json", R"({"locale": "en-US"})");
        std::filesystem::create_directories(folder());
        _settings.emplace(DeviceSettings::open(root()).value());
        open(DevicePaths(root()), {"/usr/share/applications"});
    }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::filesystem::path folder() const { return root() / "usr/share/applications"; }
    [[nodiscard]] std::filesystem::path outside() const { return _directory.path() / "outside"; }
    [[nodiscard]] std::filesystem::path file(const std::string& identifier) const {
        return folder() / (identifier + ".desktop");
    }
    [[nodiscard]] DeviceSettings& settings() { return *_settings; }
    [[nodiscard]] Lines log() const { return _log.lines(); }

    void open(const DevicePaths& paths, std::vector<std::string> folders) {
        _applications.emplace(paths, std::move(folders), *_settings, _log);
    }

    void write(const std::string& identifier, const std::string& lines) const {
        test::writeTestFile(file(identifier), "[Desktop Entry]\n" + lines);
    }

    [[nodiscard]] std::shared_ptr<const AppProxy> find(const std::string& identifier) {
        return _applications->applicationProxyForIdentifier(BundleIdentifier(identifier));
    }

    [[nodiscard]] std::string nameOf(const std::string& identifier) {
        const auto application = find(identifier);
        return application ? application->localizedName().string() : "none";
    }

    /// Expects that `identifier` is no application, which is logged once with `reason`, and that
    /// another application stands.
    void expectLeftOut(const std::string& identifier, const std::string& reason) {
        write("com.other", "Name=Other\n");
        const Lines before = log();
        for (int rebuild = 0; rebuild < 3; ++rebuild) {
            EXPECT_EQ(find(identifier), nullptr);
            EXPECT_EQ(nameOf("com.other"), "Other");
        }
        Lines expected = before;
        expected.push_back("Bad desktop entry: /usr/share/applications/" + identifier +
                           ".desktop: " + reason);
        EXPECT_EQ(log(), expected);
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    std::optional<DeviceSettings> _settings;
    std::optional<DeviceApplications> _applications;
};

} // namespace nimbra::device
