#include "device/DeviceDirectory.h"

#include "device/DeviceError.h"
#include "device/description/ApplicationEntries.h"
#include "device/description/DatabaseSettings.h"
#include "device/description/DescriptionFiles.h"
#include "device/description/DeviceTool.h"
#include "device/files/DevicePaths.h"
#include "device/files/Files.h"
#include "device/files/StagedDirectory.h"
#include "device/store/AccountDatabase.h"
#include "device/store/ConsentDatabase.h"

#include <algorithm>
#include <array>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

namespace nimbra::device {

namespace {

std::filesystem::path preferenceFileName(const std::string& domain) {
    return domain + ".json";
}

std::expected<void, Error> writePreferences(const std::filesystem::path& directory,
                                            const DeviceDescription& description) {
    for (const auto& [domain, values] : description.preferences) {
        if (auto written =
                writeFileAtomically(directory / preferenceFileName(domain), fileText(values));
            !written) {
            return written;
        }
    }
    return {};
}

/// Removes the files of the domains that `description` does not have.
std::expected<void, Error> removeOtherPreferences(const std::filesystem::path& directory,
                                                  const DeviceDescription& description) {
    const auto files = entriesOfDirectory(directory);
    if (!files) {
        return std::unexpected(files.error());
    }
    for (const std::filesystem::path& file : *files) {
        std::error_code failure;
        if (file.extension() == ".json" && !description.preferences.contains(file.stem()) &&
            !std::filesystem::remove(file, failure) && failure) {
            return std::unexpected(fileError(file, "cannot be removed", failure.value()));
        }
    }
    return {};
}

std::expected<void, Error> replacePreferences(const DevicePaths& paths,
                                              const DeviceDescription& description) {
    const auto directory = paths.resolve(kPreferencesDirectory);
    if (!directory) {
        return std::unexpected(directory.error());
    }
    std::error_code failure;
    std::filesystem::create_directory(*directory, failure);
    if (failure) {
        return std::unexpected(fileError(*directory, "cannot be made", failure.value()));
    }
    auto written = writePreferences(*directory, description);
    return written ? removeOtherPreferences(*directory, description) : written;
}

/// Takes over what `device.json` holds, key by key.
void applyFacts(const GivenDescription& change, DeviceDescription& description) {
    const auto apply = [&](const char* key, auto member) {
        if (change.keys.contains(key)) {
            description.*member = change.description.*member;
        }
    };
    apply("name", &DeviceDescription::name);
    apply("idiom", &DeviceDescription::idiom);
    apply("screen", &DeviceDescription::screen);
    apply("locale", &DeviceDescription::locale);
    apply("timeZone", &DeviceDescription::timeZone);
    apply("cellularData", &DeviceDescription::cellularData);
    apply("wirelessVariant", &DeviceDescription::wirelessVariant);
}

bool changesFacts(const GivenDescription& change) {
    constexpr std::array facts{"name",     "idiom",        "screen",         "locale",
                               "timeZone", "cellularData", "wirelessVariant"};
    return std::ranges::any_of(facts,
                               [&change](const char* key) { return change.keys.contains(key); });
}

std::expected<AccountDatabase, Error> openAccounts(const DevicePaths& paths) {
    const auto path = paths.resolve(kAccountsDatabase);
    if (!path) {
        return std::unexpected(path.error());
    }
    return AccountDatabase::open(*path);
}

/// The database of consent where the device has one already.
std::expected<std::optional<ConsentDatabase>, Error> openConsent(const DevicePaths& paths) {
    const auto path = paths.resolve(kConsentDatabase);
    if (!path) {
        return std::unexpected(path.error());
    }
    return ConsentDatabase::open(*path);
}

std::expected<void, Error> replaceConsent(const DevicePaths& paths,
                                          std::optional<ConsentDatabase> database,
                                          const DeviceDescription& description) {
    if (!database) {
        const auto path = paths.resolve(kConsentDatabase);
        if (!path) {
            return std::unexpected(path.error());
        }
        auto created = ConsentDatabase::create(*path);
        if (!created) {
            return std::unexpected(created.error());
        }
        database = std::move(*created);
    }
    return database->replaceRecords(description.consent);
}

std::expected<void, Error> replaceApplications(const DevicePaths& paths,
                                               const DeviceDescription& description) {
    const auto directory = paths.resolve(kApplicationsDirectory);
    return directory ? replaceApplicationEntries(*directory, description.apps)
                     : std::unexpected(directory.error());
}

/// Makes everything of a device in the empty directory `root`.
std::expected<void, Error> buildDevice(const std::filesystem::path& root,
                                       const DeviceDescription& description,
                                       const DeviceParts& parts) {
    const DevicePaths paths(root);
    const auto below = [&root](std::string_view devicePath) {
        return root / std::filesystem::path(devicePath).relative_path();
    };
    for (const std::string_view directory : {kPreferencesDirectory, kApplicationsDirectory}) {
        std::error_code failure;
        std::filesystem::create_directories(below(directory), failure);
        if (failure) {
            return std::unexpected(fileError(root, "cannot be made", failure.value()));
        }
    }
    for (const DescriptionFile* file :
         {&deviceFile, &restrictionsFile, &documentsFile, &deviceListFile}) {
        if (auto written = writeDescriptionFile(paths, *file, description); !written) {
            return written;
        }
    }
    if (auto written = writePreferences(below(kPreferencesDirectory), description); !written) {
        return written;
    }
    if (auto written = writeApplicationEntries(below(kApplicationsDirectory), description.apps);
        !written) {
        return written;
    }
    if (auto written =
            replaceDatabaseSettings(paths, description.databaseSettings, parts.databaseBundle);
        !written) {
        return written;
    }
    if (auto written = replaceTool(paths, description.tool, parts.tool); !written) {
        return written;
    }
    auto accounts = AccountDatabase::create(below(kAccountsDatabase));
    auto written = accounts ? accounts->replaceAccounts(description.accounts)
                            : std::unexpected(accounts.error());
    return written ? replaceConsent(paths, std::nullopt, description) : written;
}

} // namespace

std::expected<void, Error> createDeviceDirectory(const std::filesystem::path& root,
                                                 const DeviceDescription& description,
                                                 const DeviceParts& parts) {
    auto staged = StagedDirectory::start(root);
    if (!staged) {
        return std::unexpected(staged.error());
    }
    if (auto built = buildDevice(staged->path(), description, parts); !built) {
        // The place where it was built goes with the failure and says nothing to anybody.
        return std::unexpected(withPath(built.error(), staged->path(), root.string()));
    }
    return staged->putInPlace();
}

std::expected<void, Error> changeDeviceDirectory(const std::filesystem::path& root,
                                                 const GivenDescription& change,
                                                 const DeviceParts& parts) {
    const DevicePaths paths(root);
    const DeviceDescription& description = change.description;
    const auto isGiven = [&change](const char* key) { return change.keys.contains(key); };

    // Everything is read before anything is written.
    auto facts = readDescriptionFile(paths, deviceFile);
    if (!facts) {
        return std::unexpected(facts.error());
    }
    auto accounts = openAccounts(paths);
    if (!accounts) {
        return std::unexpected(accounts.error());
    }
    auto consent = openConsent(paths);
    if (!consent) {
        return std::unexpected(consent.error());
    }

    std::expected<void, Error> changed;
    if (changesFacts(change)) {
        applyFacts(change, *facts);
        changed = writeDescriptionFile(paths, deviceFile, *facts);
    }
    for (const auto& [key, file] :
         {std::pair{"restrictions", &restrictionsFile}, std::pair{"documents", &documentsFile},
          std::pair{"deviceList", &deviceListFile}}) {
        if (changed && isGiven(key)) {
            changed = writeDescriptionFile(paths, *file, description);
        }
    }
    if (changed && isGiven("databaseSettings")) {
        changed =
            replaceDatabaseSettings(paths, description.databaseSettings, parts.databaseBundle);
    }
    if (changed && isGiven("tool")) {
        changed = replaceTool(paths, description.tool, parts.tool);
    }
    if (changed && isGiven("preferences")) {
        changed = replacePreferences(paths, description);
    }
    if (changed && isGiven("accounts")) {
        changed = accounts->replaceAccounts(description.accounts);
    }
    if (changed && isGiven("apps")) {
        changed = replaceApplications(paths, description);
    }
    if (changed && isGiven("consent")) {
        changed = replaceConsent(paths, std::move(*consent), description);
    }
    return changed;
}

} // namespace nimbra::device
