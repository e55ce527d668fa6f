#include "tools/mrctl/Commands.h"

#include "device/DeviceError.h"
#include "device/description/DescriptionFiles.h"
#include "device/files/Folders.h"
#include "tools/mrctl/ArchiveFile.h"
#include "tools/mrctl/DeviceContents.h"
#include "tools/mrctl/Report.h"
#include "tools/mrctl/StatusText.h"

#include <cerrno>
#include <ostream>
#include <system_error>

namespace nimbra::mrctl {

namespace {

using device::DevicePaths;

/// `root` as an absolute path without links, so that messages name it in one way only.
std::expected<std::filesystem::path, Error> canonicalRoot(const std::filesystem::path& root) {
    std::error_code failure;
    auto canonical = std::filesystem::canonical(root, failure);
    if (!failure && !std::filesystem::is_directory(canonical, failure) && !failure) {
        failure = std::make_error_code(std::errc::not_a_directory);
    }
    if (failure) {
        return std::unexpected(device::fileError(root, "cannot be read", failure.value()));
    }
    return canonical;
}

std::expected<void, Error> diagnose(const Arguments& arguments, const DevicePaths& paths) {
    // An archive of a directory that is no device would tell nothing, and look as if it did.
    if (auto checked = device::checkStateFolder(paths); !checked) {
        return checked;
    }
    const std::filesystem::path archive = arguments.path;
    const auto contents = DeviceContents::read(paths, !arguments.withoutLog);
    return ArchiveFile::write(archive, Report::of(contents, paths.root(), archive.filename()));
}

std::expected<void, Error> showStatus(const Arguments& arguments, const DevicePaths& paths,
                                      std::ostream& output) {
    if (auto checked = device::checkStateFolder(paths); !checked) {
        return checked;
    }
    const auto contents = DeviceContents::read(paths, false);
    for (const auto& [part, what] : contents.problems) {
        if (part == "accounts" || part == "documents" || part == "progress") {
            return std::unexpected(device::deviceError(what));
        }
    }
    output << (arguments.asJson ? device::fileText(statusAsJson(contents)) : statusText(contents));
    if (!output.flush()) {
        return std::unexpected(device::deviceError("the output cannot be written"));
    }
    return {};
}

} // namespace

std::expected<void, Error> run(const Arguments& arguments, std::ostream& output) {
    const auto root = canonicalRoot(arguments.root);
    if (!root) {
        return std::unexpected(root.error());
    }
    const DevicePaths paths(*root);
    return arguments.command == Command::diagnose ? diagnose(arguments, paths)
                                                  : showStatus(arguments, paths, output);
}

} // namespace nimbra::mrctl
