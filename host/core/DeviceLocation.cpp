#include "host/core/DeviceLocation.h"

#include "device/DeviceDirectory.h"
#include "device/files/Files.h"
#include "device/json/JsonReader.h"
#include "host/core/BundleSearch.h"

#include <cstdlib>
#include <pwd.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace nimbra::host {

namespace {

/// The directory in the environment variable `name`; empty where it is not set or, as the rules
/// of these variables want, not absolute.
std::filesystem::path directoryInEnvironment(const char* name) {
    const char* value = std::getenv(name);
    const std::filesystem::path path = value != nullptr ? value : "";
    return path.is_absolute() ? path : std::filesystem::path();
}

/// The user's own directory: what the environment says, or else the system's list of users.
std::filesystem::path homeDirectory() {
    if (auto home = directoryInEnvironment("HOME"); !home.empty()) {
        return home;
    }
    // Nothing else in these programs asks for users, on any thread.
    const passwd* const user = ::getpwuid(::getuid());
    const std::filesystem::path home = user != nullptr ? user->pw_dir : "";
    return home.is_absolute() ? home : "/";
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
    return homeDirectory() / ".local/state/nimbra";
}

std::filesystem::path defaultDeviceDirectory() {
    return stateDirectory() / "device";
}

std::filesystem::path sampleDescription() {
    return (executableDirectory() / "../share/nimbra/sample-device.json").lexically_normal();
}

std::expected<device::GivenDescription, Error> readDescription(const std::filesystem::path& file) {
    const auto text = device::readFile(file);
    if (!text) {
        return std::unexpected(text.error());
    }
    const auto reader = device::JsonReader::parse(*text, file.string());
    if (!reader) {
        return std::unexpected(reader.error());
    }
    device::GivenDescription given = device::readDeviceDescription(*reader);
    if (auto problem = reader->problem()) {
        return std::unexpected(std::move(*problem));
    }
    return given;
}

std::expected<bool, Error> provideDevice(const std::filesystem::path& root) {
    if (isThere(root)) {
        return false;
    }
    const auto sample = readDescription(sampleDescription());
    if (!sample) {
        return std::unexpected(sample.error());
    }
    const auto made = device::createDeviceDirectory(root, sample->description, findDeviceParts());
    // Where it failed another process may have been quicker, and its device is as good.
    if (!made && !isThere(root)) {
        return std::unexpected(made.error());
    }
    return made.has_value();
}

} // namespace nimbra::host
