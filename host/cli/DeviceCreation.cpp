#include "host/cli/DeviceCreation.h"

#include "device/DeviceDirectory.h"
#include "host/cli/TextLayout.h"
#include "host/core/BundleSearch.h"
#include "host/core/DeviceLocation.h"

#include <ostream>

namespace nimbra::cli {

namespace {

std::unexpected<Failure> badInput(const Error& error) {
    return std::unexpected(Failure{exitBadInput, error.description});
}

} // namespace

std::expected<void, Failure> provideDevice(const std::filesystem::path& root,
                                           std::ostream& messages) {
    const auto made = host::provideDevice(root);
    if (!made) {
        return badInput(made.error());
    }
    if (*made) {
        messages << "settingsctl: made the sample device in " << printable(root.string()) << '\n';
    }
    return {};
}

std::expected<void, Failure> initializeDevice(const std::filesystem::path& root,
                                              const std::optional<std::filesystem::path>& from,
                                              std::ostream& out, std::ostream& messages) {
    const auto given = host::readDescription(from.value_or(host::sampleDescription()));
    if (!given) {
        return badInput(given.error());
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
    out << printable("Made the device \"" + given->description.name + "\" in " + root.string() +
                     ".")
        << '\n';
    return {};
}

} // namespace nimbra::cli
