#pragma once

#include "device/DeviceDescription.h"
#include "device/documents/ProgressValues.h"
#include "device/files/DevicePaths.h"

#include <cstddef>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::mrctl {

/// What stands on a device, as it is, read without writing anything. What cannot be read is absent
/// and a problem; everything else is read all the same.
struct DeviceContents {
    struct Preferences {
        /// In one line, and another one for each.
        std::string domain;
        nlohmann::ordered_json values;
    };
    struct Application {
        std::string identifier;
        bool isHidden = false;
        bool isRunning = false;
    };
    struct Progress {
        std::string name;
        device::ProgressValues values;
    };
    struct Problem {
        /// "accounts", for example.
        std::string part;
        /// In one line, with the path on this machine.
        std::string what;
    };
    /// The newest lines of the log that are read.
    static constexpr std::size_t mostLogLines = 10'000;

    // Of each description only the part counts that its file holds.

    std::optional<device::DeviceDescription> facts;
    std::optional<device::DeviceDescription> restrictions;
    std::optional<device::DeviceDescription> documents;
    std::optional<device::DeviceDescription> deviceList;

    std::optional<std::vector<device::DeviceDescription::AccountDescription>> accounts;
    std::optional<std::int64_t> accountsVersion;
    std::optional<std::vector<device::DeviceDescription::ConsentRecord>> consent;
    std::optional<std::int64_t> consentVersion;

    std::vector<Preferences> preferences;
    std::vector<Application> applications;
    std::vector<Progress> progress;
    std::optional<std::vector<std::string>> log;
    std::vector<Problem> problems;

    /// Reads the device of `paths`, with the end of its log where `withLog` is set.
    [[nodiscard]] static DeviceContents read(const device::DevicePaths& paths, bool withLog);
};

} // namespace nimbra::mrctl
