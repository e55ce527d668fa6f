#pragma once

#include "platform/PlatformServices.h"
#include "platform/apps/Applications.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/system/Localization.h"
#include "platform/system/RestrictionsProfile.h"

#include <cstddef>
#include <memory>
#include <unordered_map>

namespace nimbra::bench {

/// The application `index` of a benchmark's device: its identifier and its name, of which the
/// order is another one.
[[nodiscard]] std::string applicationIdentifier(std::size_t index);
[[nodiscard]] std::string applicationName(std::size_t index);

/// Services that have every answer about applications at hand, so that what is left of building
/// rows over them is the page's own work.
class MemoryServices final : private PrivacyConsentStore,
                             private Applications,
                             private RestrictionsProfile,
                             private Localization {
public:
    /// For everything else there is `others`, which outlive this.
    MemoryServices(std::size_t applications, const PlatformServices& others);

    [[nodiscard]] PlatformServices services();

private:
    std::optional<PrivacyAccessRecords>
    PRVAccessCopyInformation(const PrivacyService& service) override;
    bool PRVAccessSetForBundle(const PrivacyService& service, const Bundle* bundle,
                               bool granted) override;
    std::shared_ptr<const AppProxy>
    applicationProxyForIdentifier(const BundleIdentifier& identifier) override;
    bool isAppCellularDataModificationAllowed() const override { return true; }
    bool isCloudSyncAllowed(const BundleIdentifier& /*bundle*/) const override { return true; }
    Locale currentLocale() const override;
    Text stringWithFormatLocaleArguments(const Text& format, const Locale& locale,
                                         std::span<const FormatArgument> arguments) const override;
    int localizedStandardCompare(const Text& left, const Text& right) const override;
    std::unique_ptr<DateFormatter> dateFormatterWithFormat(const Text& format) const override;

    const PlatformServices _others;
    PrivacyAccessRecords _tidewater;
    PrivacyAccessRecords _brackwater;
    std::unordered_map<BundleIdentifier, std::shared_ptr<const AppProxy>> _apps;
};

} // namespace nimbra::bench
