#include "device/description/ApplicationEntries.h"

#include "device/DeviceError.h"
#include "device/files/ApplicationFileName.h"
#include "device/files/Files.h"
#include "device/files/PlainFile.h"

#include <algorithm>
#include <map>
#include <set>
#include <string_view>
#include <system_error>

namespace nimbra::device {

namespace {

constexpr std::string_view suffix = ".desktop";

std::string blanks(std::size_t count) {
    std::string escaped;
    while (count-- > 0) {
        escaped += "\\s";
    }
    return escaped;
}

/// `text` as a value of a desktop entry, whose readers drop blanks at both ends.
std::string escaped(std::string_view text) {
    const auto leading = std::min(text.find_first_not_of(' '), text.size());
    std::string value = blanks(leading);
    text.remove_prefix(leading);
    const auto end = text.find_last_not_of(' ') + 1; // 0 where nothing is left
    for (const char character : text.substr(0, end)) {
        switch (character) {
        case '\n':
            value += "\\n";
            break;
        case '\t':
            value += "\\t";
            break;
        case '\r':
            value += "\\r";
            break;
        case '\\':
            value += "\\\\";
            break;
        default:
            value += character;
        }
    }
    return value + blanks(text.size() - end);
}

std::string fileNameOf(const DeviceDescription::Application& application) {
    return applicationFileName(application.identifier, suffix);
}

/// Whether `content` stands in a file at `path`; a link to one is something else.
bool holds(const std::filesystem::path& path, const std::string& content) {
    std::error_code failure;
    return std::filesystem::is_regular_file(std::filesystem::symlink_status(path, failure)) &&
           readPlainFile(path) == content;
}

std::expected<void, Error> removeOthers(const std::filesystem::path& directory,
                                        const std::set<std::string>& kept) {
    const auto files = entriesOfDirectory(directory);
    if (!files) {
        return std::unexpected(files.error());
    }
    for (const std::filesystem::path& file : *files) {
        std::error_code failure;
        if (file.native().ends_with(suffix) && !kept.contains(file.filename()) &&
            !std::filesystem::remove(file, failure) && failure) {
            return std::unexpected(fileError(file, "cannot be removed", failure.value()));
        }
    }
    return {};
}

} // namespace

std::string desktopEntryOf(const DeviceDescription::Application& application) {
    std::string entry =
        "[Desktop Entry]\nType=Application\nName=" + escaped(application.name) + '\n';
    if (application.removedSystemApp) {
        entry += "Hidden=true\n";
    }
    if (!application.entitlements.empty()) {
        const auto json =
            application.entitlements.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
        entry += "X-Nimbra-Entitlements=" + escaped(json) + '\n';
    }
    return entry;
}

std::expected<void, Error>
writeApplicationEntries(const std::filesystem::path& directory,
                        const std::vector<DeviceDescription::Application>& applications) {
    std::map<std::string, std::string> files;
    for (const DeviceDescription::Application& application : applications) {
        files.emplace(fileNameOf(application), desktopEntryOf(application));
    }
    return writeNewFiles(directory, files);
}

std::expected<void, Error>
replaceApplicationEntries(const std::filesystem::path& directory,
                          const std::vector<DeviceDescription::Application>& applications) {
    std::error_code failure;
    std::filesystem::create_directories(directory, failure);
    if (failure) {
        return std::unexpected(fileError(directory, "cannot be made", failure.value()));
    }
    std::set<std::string> names;
    for (const DeviceDescription::Application& application : applications) {
        const std::string name = *names.insert(fileNameOf(application)).first;
        const std::string entry = desktopEntryOf(application);
        // Each file that is written is flushed, which takes its time where there are many.
        if (holds(directory / name, entry)) {
            continue;
        }
        if (auto written = writeFileAtomically(directory / name, entry); !written) {
            return written;
        }
    }
    return removeOthers(directory, names);
}

} // namespace nimbra::device
