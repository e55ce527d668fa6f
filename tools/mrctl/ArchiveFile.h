#pragma once

#include "platform/values/Error.h"
#include "tools/mrctl/Report.h"

#include <expected>
#include <filesystem>
#include <string>

namespace nimbra::mrctl {

/// A report as a gzip-compressed tar archive: the only place that calls the library.
class ArchiveFile {
public:
    /// Writes `report` to `path`, replacing a plain file that stands there; anything else there, a
    /// link included, is an error. It is written beside it, for the owner's eyes only, under a
    /// hidden name that begins with `temporaryPrefix`, flushed and renamed: whatever happens,
    /// nothing or a whole archive stands at `path`. On an error nothing is left; what a killed
    /// program has left there goes with the next writing.
    [[nodiscard]] static std::expected<void, Error> write(const std::filesystem::path& path,
                                                          const Report& report);

    static constexpr auto temporaryPrefix = ".mrctl-";

    [[nodiscard]] static std::string libraryVersion();
};

} // namespace nimbra::mrctl
