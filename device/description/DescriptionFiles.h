#pragma once

#include "device/DeviceDescription.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>

namespace nimbra::device {

class JsonReader;

/// A file of the device directory that holds a part of the device's description. What is left out
/// of it has the description's default.
struct DescriptionFile {
    std::string_view path;
    /// Reads the whole file into its part of a description.
    void (*read)(const JsonReader& reader, DeviceDescription& description);
    /// The file's content for a description.
    nlohmann::ordered_json (*content)(const DeviceDescription& description);
};

extern const DescriptionFile deviceFile;
extern const DescriptionFile restrictionsFile;
extern const DescriptionFile documentsFile;
extern const DescriptionFile deviceListFile;

/// A description whose part in `file` is as the file says and whose other parts are the default.
/// On a real device a file may be missing: what Linux tells of the machine then stands for it.
[[nodiscard]] std::expected<DeviceDescription, Error>
readDescriptionFile(const DevicePaths& paths, const DescriptionFile& file);

/// The same for a file that was read already: `text` is what it holds, and messages call it `name`.
[[nodiscard]] std::expected<DeviceDescription, Error>
readDescription(std::string_view text, const std::string& name, const DescriptionFile& file);

/// Writes the part of `description` that belongs to `file`, whose directory exists.
[[nodiscard]] std::expected<void, Error> writeDescriptionFile(const DevicePaths& paths,
                                                              const DescriptionFile& file,
                                                              const DeviceDescription& description);

/// `content` as it stands in a file.
[[nodiscard]] std::string fileText(const nlohmann::ordered_json& content);

} // namespace nimbra::device
