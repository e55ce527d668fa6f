#include "tools/mrctl/DeviceContents.h"

#include "device/DeviceError.h"
#include "device/apps/ApplicationFolders.h"
#include "device/apps/InstalledApplications.h"
#include "device/apps/RecordedProcesses.h"
#include "device/description/DescriptionFiles.h"
#include "device/documents/ProgressFiles.h"
#include "device/files/Files.h"
#include "device/files/PlainFile.h"
#include "device/json/JsonParser.h"
#include "device/store/AccountDatabase.h"
#include "device/store/ConsentDatabase.h"
#include "device/system/LogLines.h"
#include "platform/system/SystemLog.h"

#include <algorithm>
#include <cerrno>
#include <expected>
#include <filesystem>
#include <string_view>
#include <utility>

namespace nimbra::mrctl {

namespace {

using device::DeviceDescription;
using device::DevicePaths;

/// For services that tell a log: nothing that is only read has anything to tell.
class NoLog final : public SystemLog {
public:
    [[nodiscard]] bool isEnabled(LogLevel /*level*/) const override { return false; }
    void write(LogLevel /*level*/, const std::string& /*message*/) override {}
};

/// Reads one part after the other and notes what cannot be read.
class Reader {
public:
    Reader(const DevicePaths& paths, DeviceContents& contents)
        : _paths(paths), _contents(contents) {}

    void readAll(bool withLog) {
        _contents.facts = part("device", device::readDescriptionFile(_paths, device::deviceFile));
        _contents.restrictions =
            part("restrictions", device::readDescriptionFile(_paths, device::restrictionsFile));
        _contents.documents =
            part("documents", device::readDescriptionFile(_paths, device::documentsFile));
        readDeviceList();
        readAccounts();
        readConsent();
        readPreferences();
        readApplications();
        readProgress();
        if (withLog) {
            _contents.log =
                part("log", device::newestLogLines(_paths, DeviceContents::mostLogLines));
        }
    }

private:
    void note(const char* part, const Error& error) {
        _contents.problems.push_back({.part = part, .what = error.description});
    }

    template <class Value>
    std::optional<Value> part(const char* name, std::expected<Value, Error> read) {
        if (!read) {
            note(name, read.error());
            return std::nullopt;
        }
        return std::move(*read);
    }

    /// The database at `devicePath`, opened by `open`; nothing, noted, where that fails.
    template <class Open>
    auto opened(const char* name, std::string_view devicePath, Open open) {
        const auto path = _paths.resolve(devicePath);
        using Opened = decltype(open(*path));
        return part(name, path ? open(*path) : Opened(std::unexpected(path.error())));
    }

    void readDeviceList() {
        auto list = device::readDescriptionFile(_paths, device::deviceListFile);
        // A device without the file knows of no others.
        const bool isMissing = !list && list.error().code == ENOENT;
        _contents.deviceList =
            part("device-list", isMissing ? DeviceDescription() : std::move(list));
    }

    void readAccounts() {
        auto database =
            opened("accounts", device::kAccountsDatabase, device::AccountDatabase::openForReading);
        if (database) {
            _contents.accounts = part("accounts", database->accounts());
            _contents.accountsVersion = part("accounts", database->version());
        }
    }

    void readConsent() {
        auto database =
            opened("consent", device::kConsentDatabase, device::ConsentDatabase::openForReading);
        if (database && !*database) {
            // One that an earlier version made.
            _contents.consent.emplace();
        } else if (database) {
            _contents.consent = part("consent", (*database)->allRecords());
            _contents.consentVersion = part("consent", (*database)->version());
        }
    }

    void readPreferences() {
        const auto directory = _paths.resolve(device::kPreferencesDirectory);
        const auto files = part("preferences", directory ? device::entriesOfDirectory(*directory)
                                                         : std::unexpected(directory.error()));
        if (!files) {
            return;
        }
        for (const std::filesystem::path& path : *files) {
            if (path.extension() != ".json") {
                continue;
            }
            const auto file = device::PlainFile::read(path, device::kMostBytesOfFile, path);
            auto values = part("preferences", file ? device::parseJson(file->content, path)
                                                   : std::unexpected(file.error()));
            if (values) {
                _contents.preferences.push_back(
                    {.domain = unusedDomain(path.stem()), .values = std::move(*values)});
            }
        }
    }

    /// A file's name in one line, with a number where another is the same then.
    [[nodiscard]] std::string unusedDomain(const std::string& fileName) const {
        const std::string domain = device::oneLine(fileName);
        std::string name = domain;
        for (int number = 2;
             std::ranges::find(_contents.preferences, name, &DeviceContents::Preferences::domain) !=
             _contents.preferences.end();
             ++number) {
            name = domain + '-' + std::to_string(number);
        }
        return name;
    }

    void readApplications() {
        auto installed = device::InstalledApplications::read(
            _paths, device::applicationFolders(_paths, device::processEnvironment));
        for (const Error& problem : installed.problems) {
            note("applications", problem);
        }
        NoLog log;
        const device::RecordedProcesses processes(_paths, log);
        for (const auto& [identifier, isHidden] : installed.applications) {
            const auto isRunning =
                part("applications", processes.isRunning(BundleIdentifier(identifier)));
            _contents.applications.push_back({.identifier = identifier,
                                              .isHidden = isHidden,
                                              .isRunning = isRunning.value_or(false)});
        }
    }

    void readProgress() {
        auto files = part("progress", device::readProgressFiles(_paths));
        for (auto& [name, values] : files.value_or(std::vector<device::ProgressFileContent>())) {
            if (auto read = part("progress", std::move(values))) {
                _contents.progress.push_back({.name = name, .values = std::move(*read)});
            }
        }
    }

    const DevicePaths& _paths;
    DeviceContents& _contents;
};

} // namespace

DeviceContents DeviceContents::read(const device::DevicePaths& paths, bool withLog) {
    DeviceContents contents;
    Reader(paths, contents).readAll(withLog);
    return contents;
}

} // namespace nimbra::mrctl
