#pragma once

#include "platform/privacy/PrivacyConsentStore.h"

#include <map>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra {

/// What the consent store holds, by application: one that has records of several services is found
/// once, with all of them. The cache never asks the store itself. Not thread-safe.
///
/// Before the first `addAccessInfoForServiceName` there is nothing in it, not even an empty list;
/// an application that it does not know has no bundle and no services.
class RSPServiceAccessCache {
public:
    struct ServiceEntry {
        bool granted = false;
        PrivacyService serviceName;
    };
    using ServiceEntries = std::vector<ServiceEntry>;

    /// Adds each of `records`, which may be absent, under its application. A record whose bundle
    /// has no identifier is left out; one that does not say whether access is granted counts as
    /// refused.
    void addAccessInfoForServiceName(const std::optional<PrivacyAccessRecords>& records,
                                     const PrivacyService& serviceName);

    /// The applications in the cache, in no particular order.
    [[nodiscard]] std::optional<std::vector<BundleIdentifier>> allBundleIDs() const;

    /// Whether the application may use at least one of its services.
    [[nodiscard]] bool isAccessGrantedForBundleID(const BundleIdentifier& bundleID) const;

    /// The bundle in the first record of the application; null for none. It lives as long as the
    /// cache.
    [[nodiscard]] const Bundle* bundleForBundleID(const BundleIdentifier& bundleID) const;

    /// The application's services in the order in which they were added: those of the cache, not a
    /// copy; null for none. They live as long as the cache.
    [[nodiscard]] ServiceEntries* servicesForBundleID(const BundleIdentifier& bundleID);

    /// Sets every service of the application to `granted`; nothing for one that is not known.
    void setAccessGrantedForBundleID(bool granted, const BundleIdentifier& bundleID);

    /// The names of the application's services, in order; a service that was added twice is there
    /// twice.
    [[nodiscard]] std::optional<std::vector<PrivacyService>>
    serviceNamesForBundleID(const BundleIdentifier& bundleID) const;

protected:
    struct BundleEntry {
        ServiceEntries services;
        std::shared_ptr<const Bundle> bundle;
    };

    std::optional<std::map<BundleIdentifier, BundleEntry>> _accessInfoByBundleID;
};

} // namespace nimbra
