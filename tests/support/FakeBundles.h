#pragma once

#include "platform/system/Bundles.h"
#include "tests/support/FakeBundle.h"

#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

/// Knows the pane's bundle, or none.
class FakeBundles final : public Bundles {
public:
    [[nodiscard]] std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const override {
        ++lookups;
        return paneBundle && paneBundle->identifier() == identifier ? paneBundle : nullptr;
    }
    [[nodiscard]] std::shared_ptr<Bundle> bundleWithPath(const Text& path) override {
        pathsAskedFor.push_back(path.string());
        return bundleAtPath;
    }
    [[nodiscard]] std::shared_ptr<Bundle>
    bundleForClass(const std::type_info& classType) const override {
        classesAskedFor.emplace_back(classType.name());
        return bundleOfClasses;
    }

    std::shared_ptr<FakeBundle> paneBundle = std::make_shared<FakeBundle>(
        std::map<std::string, Text>{{"CLOUD_DRIVE", "Nimbra Drive"},
                                    {"CLOUD_DRIVE_UPGRADE_LINK", "Upgrade"},
                                    {"CLOUD_DRIVE_EXPLANATION", "Keeps your documents."},
                                    {"CLOUD_DRIVE_PRIVACY_INFO", "Look me up"},
                                    {"CLOUD_DRIVE_NUM_APPS", "{0} apps"},
                                    {"TURNING_ON_CLOUD_DRIVE", "Turning on"},
                                    {"TURNING_OFF_CLOUD_DRIVE", "Turning off"},
                                    {"CLOUD_DRIVE_CELLULAR", "Cellular"},
                                    {"CLOUD_DRIVE_CELLULAR_EXPLANATION_WIFI", "Over Wi-Fi."},
                                    {"CLOUD_DRIVE_CELLULAR_EXPLANATION_WIFI_WLAN", "Over WLAN."},
                                    {"CLOUD_DRIVE_DIAGNOSE_TEXT", "Finds faults."},
                                    {"CLOUD_DRIVE_DIAGNOSE", "Diagnose"},
                                    {"CLOUD_DRIVE_DIAGNOSE_GATHER", "Gathering"},
                                    {"CLOUD_DRIVE_DIAGNOSE_ERROR", "No archive"},
                                    {"CLOUD_DRIVE_DIAGNOSE_ERROR_TEXT", "Try again."},
                                    {"CLOUD_DRIVE_DIAGNOSE_ERROR_OK", "OK"}});
    /// The bundle that stands at every path; null for none.
    std::shared_ptr<FakeBundle> bundleAtPath;
    /// The paths at which a bundle was looked for, in order.
    std::vector<std::string> pathsAskedFor;
    /// How often a bundle was looked up.
    mutable int lookups = 0;
    /// The bundle that every class belongs to.
    std::shared_ptr<FakeBundle> bundleOfClasses;
    /// The classes whose bundle was looked up, by their mangled names.
    mutable std::vector<std::string> classesAskedFor;
};

} // namespace nimbra::test
