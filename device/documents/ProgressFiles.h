#pragma once

#include "device/documents/ProgressValues.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string>
#include <vector>

namespace nimbra::device {

/// A file in the device's `run/nimbra/progress`, and what it tells.
struct ProgressFileContent {
    /// The file's name without ".json".
    std::string name;
    std::expected<ProgressValues, Error> values;
};

/// The progress that other processes publish now, sorted by name; none where the folder is missing.
/// Any thread.
[[nodiscard]] std::expected<std::vector<ProgressFileContent>, Error>
readProgressFiles(const DevicePaths& paths);

/// Those of `files`, a list of the folder, that tell of a progress and are still there: a sync that
/// ends takes its file away. Any thread.
[[nodiscard]] std::vector<ProgressFileContent>
readListedProgressFiles(const std::vector<std::filesystem::path>& files);

} // namespace nimbra::device
