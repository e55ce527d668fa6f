#include "pane/RSPNimbraDriveViewController.h"
#include "platform/apps/AppTerminator.h"
#include "platform/apps/Applications.h"
#include "platform/privacy/PrivacyConsentStore.h"
#include "platform/system/RestrictionsProfile.h"
#include "support/LogMessages.h"

#include <algorithm>
#include <string_view>
#include <vector>

namespace nimbra {

namespace {

/// An application that is entitled to this has no row on the page.
constexpr std::string_view hiddenEntitlement =
    "com.vantrel.private.vantrelaccount.app-hidden-from-nimbra-settings";

/// An application reads its access when it starts, so a running one is ended. Not a fault of its:
/// nothing is reported.
const Termination accessChanged{.reason = 3, .report = false, .description = Text()};

/// Only a number hides an application: the same value as a text is a mistake of its maker.
bool isHidden(const AppProxy& app) {
    const Entitlements& entitlements = app.entitlements();
    const auto hidden = entitlements.find(hiddenEntitlement);
    return hidden != entitlements.end() && hidden->second.isTrueNumber();
}

BundleIdentifier bundleIDOf(const Specifier& row) {
    return BundleIdentifier(row.identifier().string());
}

} // namespace

SpecifierArray RSPNimbraDriveViewController::_appSpecifiersForPRVServices() {
    PrivacyConsentStore& store = services().privacyConsentStore;
    const auto tidewater = store.PRVAccessCopyInformation(kPRVServiceTidewater);
    const auto brackwater = store.PRVAccessCopyInformation(kPRVServiceBrackwater);

    _accessCache.emplace();
    _accessCache->addAccessInfoForServiceName(tidewater, kPRVServiceTidewater);
    _accessCache->addAccessInfoForServiceName(brackwater, kPRVServiceBrackwater);

    SpecifierArray rows;
    const auto bundleIDs = _accessCache->allBundleIDs();
    for (const BundleIdentifier& bundleID : *bundleIDs) {
        if (auto row = _appSpecifierWithBundleID(bundleID)) {
            rows.push_back(std::move(row));
        }
    }
    return rows;
}

std::shared_ptr<Specifier>
RSPNimbraDriveViewController::_appSpecifierWithBundleID(const BundleIdentifier& bundleID) {
    const auto app = services().applications->applicationProxyForIdentifier(bundleID);
    if (!app || app->isRemovedSystemApp()) {
        return nullptr;
    }
    if (isHidden(*app)) {
        // Access would be granted where there is no answer at all. There always is one, so a
        // hidden application keeps what the store holds of it: that is meant.
        if (_appAccessGrantedForBundleID(bundleID) == RowValue()) {
            _setAppAccessGrantedForBundleID(true, bundleID);
        }
        return nullptr;
    }
    auto row = Specifier::preferenceSpecifierNamed(
        app->localizedName(), {.target = this,
                               .set =
                                   [this](const RowValue& value, const auto& specifier) {
                                       _setAppAccessGrantedForSpecifier(value, specifier);
                                   },
                               .get =
                                   [this](const Specifier& specifier) {
                                       return _appAccessGrantedForSpecifier(specifier);
                                   },
                               .cell = SwitchCell});
    const Text identifier(bundleID.string());
    row->setIdentifier(identifier);
    row->setPropertyForKey(identifier, LazyIconAppID);
    row->setPropertyForKey(true, LazyIconLoading);
    row->setPropertyForKey(services().restrictions->isCloudSyncAllowed(bundleID), EnabledKey);
    return row;
}

void RSPNimbraDriveViewController::_setAppAccessGrantedForSpecifier(
    const RowValue& value, const std::shared_ptr<Specifier>& row) {
    _setAppAccessGrantedForBundleID(value, bundleIDOf(*row));
}

void RSPNimbraDriveViewController::_setAppAccessGrantedForBundleID(
    const RowValue& value, const BundleIdentifier& bundleID) {
    if (!_accessCache) {
        writeLogMessage(services().systemLog, log_messages::noCachedAccess);
        return;
    }
    const Bundle* bundle = _accessCache->bundleForBundleID(bundleID);
    if (bundle == nullptr) {
        // The store is asked all the same: what becomes of an absent bundle is its decision.
        writeLogMessage(services().systemLog, log_messages::noBundleForIdentifier,
                        bundleID.string());
    }
    const bool granted = boolValue(value);
    const auto serviceNames = [this, &bundleID] {
        return _accessCache->serviceNamesForBundleID(bundleID).value_or(
            std::vector<PrivacyService>());
    };
    for (const PrivacyService& service : serviceNames()) {
        // A refusal is not looked at: the switch stays where the user has put it until the rows
        // are built anew from the store.
        static_cast<void>(
            services().privacyConsentStore->PRVAccessSetForBundle(service, bundle, granted));
    }
    _accessCache->setAccessGrantedForBundleID(granted, bundleID);

    // Whichever way the switch was turned. The cloud database alone ends no application.
    if (std::ranges::count(serviceNames(), kPRVServiceTidewater) != 0) {
        services().appTerminator->terminateApplication(bundleID, accessChanged);
    }
}

RowValue RSPNimbraDriveViewController::_appAccessGrantedForSpecifier(const Specifier& row) {
    return _appAccessGrantedForBundleID(bundleIDOf(row));
}

RowValue
RSPNimbraDriveViewController::_appAccessGrantedForBundleID(const BundleIdentifier& bundleID) {
    if (!services().restrictions->isCloudSyncAllowed(bundleID)) {
        return false;
    }
    if (!_accessCache) {
        writeLogMessage(services().systemLog, log_messages::noCachedAccess);
        return false;
    }
    return _accessCache->isAccessGrantedForBundleID(bundleID);
}

} // namespace nimbra
