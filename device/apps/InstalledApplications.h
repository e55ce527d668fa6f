#pragma once

#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <string>
#include <vector>

namespace nimbra::device {

/// An application that has a desktop entry on the device.
struct InstalledApplication {
    std::string identifier;
    /// Whether its entry stands for an application that was removed.
    bool isHidden = false;

    friend bool operator==(const InstalledApplication&, const InstalledApplication&) = default;
};

/// All applications of a device, and what could not be read on the way.
struct InstalledApplications {
    /// Sorted by their identifiers.
    std::vector<InstalledApplication> applications;
    std::vector<Error> problems;

    /// Reads the entries in `folders`, which are paths on the device, the best first: of two
    /// entries with the same name, the one in the better folder counts. A folder that is missing
    /// has none. Any thread.
    [[nodiscard]] static InstalledApplications read(const DevicePaths& paths,
                                                    const std::vector<std::string>& folders);
};

} // namespace nimbra::device
