#pragma once

#include "device/store/ConsentDatabase.h"
#include "device/system/PlannedOutcomes.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace nimbra {
class SystemLog;
}

namespace nimbra::device {

/// The consent in the device's database. Any thread.
class DevicePrivacyConsentStore final : public PrivacyConsentStore {
public:
    /// A store that keeps its records in `database`, which stands at `path`; where there is none
    /// yet, the first write makes it. `log` is told of what goes wrong; it is not owned and
    /// outlives the store.
    DevicePrivacyConsentStore(std::filesystem::path path, std::optional<ConsentDatabase> database,
                              SystemLog& log);

    [[nodiscard]] std::optional<PrivacyAccessRecords>
    PRVAccessCopyInformation(const PrivacyService& service) override;

    /// Waits for the disk, and for another program that is writing. Nothing but a write that
    /// failed is logged.
    [[nodiscard]] bool PRVAccessSetForBundle(const PrivacyService& service, const Bundle* bundle,
                                             bool granted) override;

    /// The outcomes of the next calls that set something, used up one a call, in their order:
    /// false is one that is refused without anything being written. For whoever tries how a page
    /// bears refusals.
    void planSetOutcomes(std::vector<std::optional<bool>> outcomes);

private:
    // These with the mutex held.
    [[nodiscard]] std::expected<void, Error> openIfThere();
    [[nodiscard]] std::expected<std::vector<ConsentDatabase::Record>, Error>
    read(const PrivacyService& service);
    [[nodiscard]] std::expected<void, Error> write(const PrivacyService& service,
                                                   const BundleIdentifier& bundle, bool granted);

    void report(const std::string& what, const Error& error) const;

    const std::filesystem::path _path;
    SystemLog& _log;
    std::mutex _mutex;
    std::optional<ConsentDatabase> _database;
    PlannedOutcomes<bool> _setOutcomes;
};

} // namespace nimbra::device
