#include "pane/RSPServiceAccessCache.h"

#include <algorithm>
#include <iterator>
#include <ranges>

namespace nimbra {

namespace {

/// The entry of an application in `accessInfo`, which may not exist yet; null for none.
template <class AccessInfo>
auto entryForBundleID(AccessInfo& accessInfo, const BundleIdentifier& bundleID) {
    using Entry = decltype(&accessInfo->begin()->second);
    if (!accessInfo) {
        return Entry(nullptr);
    }
    const auto found = accessInfo->find(bundleID);
    return found != accessInfo->end() ? &found->second : Entry(nullptr);
}

} // namespace

void RSPServiceAccessCache::addAccessInfoForServiceName(
    const std::optional<PrivacyAccessRecords>& records, const PrivacyService& serviceName) {
    if (!_accessInfoByBundleID) {
        _accessInfoByBundleID.emplace();
    }
    if (!records) {
        return;
    }
    for (const PrivacyAccessRecord& record : *records) {
        const std::optional<BundleIdentifier>& bundleID = record.kPRVInfoBundle->identifier();
        if (!bundleID) {
            continue;
        }
        BundleEntry& entry =
            _accessInfoByBundleID
                ->try_emplace(*bundleID,
                              BundleEntry{.services = {}, .bundle = record.kPRVInfoBundle})
                .first->second;
        entry.services.push_back(
            {.granted = record.kPRVInfoGranted.value_or(false), .serviceName = serviceName});
    }
}

std::optional<std::vector<BundleIdentifier>> RSPServiceAccessCache::allBundleIDs() const {
    if (!_accessInfoByBundleID) {
        return std::nullopt;
    }
    const auto bundleIDs = std::views::keys(*_accessInfoByBundleID);
    return std::vector(bundleIDs.begin(), bundleIDs.end());
}

bool RSPServiceAccessCache::isAccessGrantedForBundleID(const BundleIdentifier& bundleID) const {
    const BundleEntry* entry = entryForBundleID(_accessInfoByBundleID, bundleID);
    return entry != nullptr && std::ranges::any_of(entry->services, &ServiceEntry::granted);
}

const Bundle* RSPServiceAccessCache::bundleForBundleID(const BundleIdentifier& bundleID) const {
    const BundleEntry* entry = entryForBundleID(_accessInfoByBundleID, bundleID);
    return entry != nullptr ? entry->bundle.get() : nullptr;
}

RSPServiceAccessCache::ServiceEntries*
RSPServiceAccessCache::servicesForBundleID(const BundleIdentifier& bundleID) {
    BundleEntry* entry = entryForBundleID(_accessInfoByBundleID, bundleID);
    return entry != nullptr ? &entry->services : nullptr;
}

void RSPServiceAccessCache::setAccessGrantedForBundleID(bool granted,
                                                        const BundleIdentifier& bundleID) {
    if (ServiceEntries* services = servicesForBundleID(bundleID)) {
        for (ServiceEntry& service : *services) {
            service.granted = granted;
        }
    }
}

std::optional<std::vector<PrivacyService>>
RSPServiceAccessCache::serviceNamesForBundleID(const BundleIdentifier& bundleID) const {
    const BundleEntry* entry = entryForBundleID(_accessInfoByBundleID, bundleID);
    if (entry == nullptr) {
        return std::nullopt;
    }
    std::vector<PrivacyService> names;
    std::ranges::transform(entry->services, std::back_inserter(names), &ServiceEntry::serviceName);
    return names;
}

} // namespace nimbra
