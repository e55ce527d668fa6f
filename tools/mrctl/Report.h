#pragma once

#include "tools/mrctl/DeviceContents.h"

#include <filesystem>
#include <string>
#include <vector>

namespace nimbra::mrctl {

/// A file of a report.
struct ReportFile {
    /// Below the report's folder.
    std::string name;
    /// What is in it, for a reader of the list.
    std::string what;
    std::string content;
};

/// What is handed on about a device to somebody who looks for a fault: its state, with pseudonyms
/// in the place of all that is its user's own affair.
struct Report {
    /// The folder that holds it all.
    std::string folder;
    std::vector<ReportFile> files;

    /// The report on what `contents` of the device in `root`, an absolute path, has. It is to stand
    /// in a file called `archiveName`.
    [[nodiscard]] static Report of(const DeviceContents& contents,
                                   const std::filesystem::path& root,
                                   const std::string& archiveName);
};

} // namespace nimbra::mrctl
