#pragma once

#include "device/DeviceDescription.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string>
#include <vector>

namespace nimbra::device {

/// The freedesktop desktop entry of `application`.
[[nodiscard]] std::string desktopEntryOf(const DeviceDescription::Application& application);

/// Writes the desktop entries of `applications` to `directory`, which is empty and built out of
/// sight.
[[nodiscard]] std::expected<void, Error>
writeApplicationEntries(const std::filesystem::path& directory,
                        const std::vector<DeviceDescription::Application>& applications);

/// Makes those of `applications` the only desktop entries in `directory`, which is made where it
/// is missing. Each is replaced as a whole; other files stay. After an error some may have been.
[[nodiscard]] std::expected<void, Error>
replaceApplicationEntries(const std::filesystem::path& directory,
                          const std::vector<DeviceDescription::Application>& applications);

} // namespace nimbra::device
