#include "device/store/DevicePrivacyConsentStore.h"

#include "device/DeviceError.h"
#include "device/files/DevicePaths.h"
#include "device/store/ConsentBundle.h"
#include "platform/system/SystemLog.h"

#include <memory>
#include <utility>

namespace nimbra::device {

DevicePrivacyConsentStore::DevicePrivacyConsentStore(std::filesystem::path path,
                                                     std::optional<ConsentDatabase> database,
                                                     SystemLog& log)
    : _path(std::move(path)), _log(log), _database(std::move(database)) {}

std::optional<PrivacyAccessRecords>
DevicePrivacyConsentStore::PRVAccessCopyInformation(const PrivacyService& service) {
    std::unique_lock lock(_mutex);
    auto found = read(service);
    lock.unlock();
    if (!found) {
        report("Can't read the consent for " + service.string(), found.error());
        return std::nullopt;
    }
    PrivacyAccessRecords records;
    records.reserve(found->size());
    for (ConsentDatabase::Record& record : *found) {
        records.push_back(
            {.kPRVInfoBundle = std::make_shared<ConsentBundle>(std::move(record.bundle)),
             .kPRVInfoGranted = record.granted});
    }
    return records;
}

bool DevicePrivacyConsentStore::PRVAccessSetForBundle(const PrivacyService& service,
                                                      const Bundle* bundle, bool granted) {
    std::unique_lock lock(_mutex);
    // Whoever plans a refusal knows of it, and who gives no bundle as well: the log is for writes
    // that fail.
    const bool isRefused = _setOutcomes.take() == false;
    if (isRefused || bundle == nullptr || !bundle->identifier()) {
        return false;
    }
    const auto written = write(service, *bundle->identifier(), granted);
    lock.unlock();
    if (!written) {
        report("Can't set the consent for " + service.string() + " of " +
                   bundle->identifier()->string(),
               written.error());
    }
    return written.has_value();
}

void DevicePrivacyConsentStore::planSetOutcomes(std::vector<std::optional<bool>> outcomes) {
    _setOutcomes.plan(std::move(outcomes));
}

std::expected<void, Error> DevicePrivacyConsentStore::openIfThere() {
    if (!_database) {
        auto opened = ConsentDatabase::open(_path);
        if (!opened) {
            return std::unexpected(opened.error());
        }
        _database = std::move(*opened);
    }
    return {};
}

std::expected<std::vector<ConsentDatabase::Record>, Error>
DevicePrivacyConsentStore::read(const PrivacyService& service) {
    if (const auto opened = openIfThere(); !opened) {
        return std::unexpected(opened.error());
    }
    return _database ? _database->records(service) : std::vector<ConsentDatabase::Record>();
}

std::expected<void, Error> DevicePrivacyConsentStore::write(const PrivacyService& service,
                                                            const BundleIdentifier& bundle,
                                                            bool granted) {
    if (auto opened = openIfThere(); !opened) {
        return opened;
    }
    if (!_database) {
        auto created = ConsentDatabase::create(_path);
        if (!created) {
            return std::unexpected(created.error());
        }
        _database = std::move(*created);
    }
    return _database->setGranted(service, bundle, granted);
}

void DevicePrivacyConsentStore::report(const std::string& what, const Error& error) const {
    const Error named =
        withPath(withPath(error, _path, kConsentDatabase), _path.parent_path(), kStateDirectory);
    _log.write(LogLevel::error, what + ": " + named.description);
}

} // namespace nimbra::device
