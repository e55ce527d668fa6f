#include "host/cli/DeviceLocation.h"

#include "device/DeviceDescription.h"
#include "device/DeviceDirectory.h"
#include "device/files/Files.h"
#include "device/json/JsonReader.h"
#include "host/core/BundleSearch.h"

#include <cstdlib>
#include <ostream>
#include <system_error>

namespace nimbra::cli {

namespace {

/// The directory in the environment variable `name`; empty where it is not set or, as the rules
/// of these variables want, not absolute.
std::filesystem::path directoryInEnvironment(const char* name) {
    const char* value = std::getenv(name);
    const std::filesystem::path path = value != nullptr ? value : "";
    return path.is_absolute() ? path : std::filesystem::path();
}

std::filesystem::path sampleDescription() {
    return (host::executableDirectory() / "../share/nimbra/sample-device.json").lexically_normal();
}

std::unexpected<Failure> badInput(const Error& error) {
    return std::unexpected(Failure{exitBadInput, error.description});
}

std::expected<device::GivenDescription, Failure>
readDescription(const std::filesystem::path& file) {
    // It may also be a pipe.
    const auto text = device::readFile(file);
    if (!text) {
        return badInput(text.error());
    }
    const auto reader = device::JsonReader::parse(*text, file.string());
    if (!reader) {
        return badInput(reader.error());
    }
    device::GivenDescription given = device::readDeviceDescription(*reader);
    if (const auto problem = reader->problem()) {
        return badInput(*problem);
    }
    return given;
}

bool isThere(const std::filesystem::path& path) {
    std::error_code ignored;
    return std::filesystem::symlink_status(path, ignored).type() !=
           std::filesystem::file_type::not_found;
}

} // namespace

std::filesystem::path stateDirectory() {
    if (const auto state = directoryInEnvironment("XDG_STATE_HOME"); !state.empty()) {
        return state / "nimbra";
    }
    return directoryInEnvironment("HOME") / ".local/state/nimbra";
}

std::filesystem::path defaultDeviceDirectory() {
    return stateDirectory() / "device";
}

std::expected<void, Failure> provideDevice(const std::filesystem::path& root,
                                           std::ostream& messages) {
    if (isThere(root)) {
        return {};
    }
    const auto sample = readDescription(sampleDescription());
    if (!sample) {
        return std::unexpected(sample.error());
    }
    const auto made =
        device::createDeviceDirectory(root, sample->description, host::findDeviceParts());
    if (made) {
        messages << "settingsctl: made the sample device in " << root.string() << '\n';
    } else if (!isThere(root)) {
        return badInput(made.error());
    }
    // Otherwise another process was quicker, and its device is as good.
    return {};
}

std::expected<void, Failure> initializeDevice(const std::filesystem::path& root,
                                              const std::optional<std::filesystem::path>& from,
                                              std::ostream& out, std::ostream& messages) {
    const auto given = readDescription(from.value_or(sampleDescription()));
    if (!given) {
        return std::unexpected(given.error());
    }
    if (const auto made =
            device::createDeviceDirectory(root, given->description, host::findDeviceParts());
        !made) {
        return badInput(made.error());
    }
    if (!given->description.runningApplications().empty()) {
        messages << "settingsctl: note: /apps: \"running\" has no effect here, applications run "
                    "only while a scenario plays\n";
    }
    out << "Made the device \"" << given->description.name << "\" in " << root.string() << ".\n";
    return {};
}

} // namespace nimbra::cli
