#include "device/description/DatabaseSettings.h"

#include "device/DeviceError.h"
#include "device/description/DescriptionFiles.h"
#include "device/files/Files.h"
#include "device/files/Folders.h"

#include <cerrno>
#include <map>
#include <string>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

/// What the files of a bundle hold, by their paths in it.
using BundleFiles = std::map<std::filesystem::path, std::string>;

std::expected<BundleFiles, Error> filesOf(const std::filesystem::path& source) {
    constexpr const char* what = "the settings bundle of the cloud database cannot be read";
    if (source.empty()) {
        return std::unexpected(fileError("TessarySettings.bundle", what, ENOENT));
    }
    BundleFiles files;
    std::error_code failure;
    std::filesystem::recursive_directory_iterator entry(source, failure);
    for (; !failure && entry != std::filesystem::recursive_directory_iterator();
         entry.increment(failure)) {
        std::error_code ignored;
        if (entry->is_directory(ignored)) {
            continue;
        }
        auto content = readFile(entry->path());
        if (!content) {
            return std::unexpected(std::move(content.error()));
        }
        files.emplace(entry->path().lexically_relative(source), std::move(*content));
    }
    if (failure) {
        return std::unexpected(fileError(source, what, failure.value()));
    }
    return files;
}

std::expected<void, Error> putBundle(const DevicePaths& paths, const BundleFiles& files) {
    const std::filesystem::path bundle = kDatabaseSettingsBundle;
    for (const auto& [name, content] : files) {
        const auto folder = makeFolder(paths, (bundle / name.parent_path()).string());
        if (!folder) {
            return std::unexpected(folder.error());
        }
        if (auto written = writeFileAtomically(*folder / name.filename(), content); !written) {
            return written;
        }
    }
    return {};
}

} // namespace

std::expected<void, Error>
replaceDatabaseSettings(const DevicePaths& paths,
                        const std::optional<DeviceDescription::DatabaseSettings>& settings,
                        const std::filesystem::path& source) {
    if (!settings) {
        return removeFolder(paths, kDatabaseSettingsBundle);
    }
    auto files = filesOf(source);
    if (!files) {
        return std::unexpected(std::move(files.error()));
    }
    files->insert_or_assign("app-groups.json",
                            fileText({{"numAppGroups", settings->numAppGroups}}));
    return putBundle(paths, *files);
}

} // namespace nimbra::device
