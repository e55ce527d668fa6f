#include "host/core/trace/TracingPrivacyConsentStore.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

namespace {

nlohmann::ordered_json identifierOf(const Bundle* bundle) {
    return bundle != nullptr && bundle->identifier()
               ? nlohmann::ordered_json(bundle->identifier()->string())
               : nlohmann::ordered_json();
}

} // namespace

std::optional<PrivacyAccessRecords>
TracingPrivacyConsentStore::PRVAccessCopyInformation(const PrivacyService& service) {
    _trace.write("consent", {{"op", "PRVAccessCopyInformation"}, {"service", service.string()}});
    return _store.PRVAccessCopyInformation(service);
}

bool TracingPrivacyConsentStore::PRVAccessSetForBundle(const PrivacyService& service,
                                                       const Bundle* bundle, bool granted) {
    _trace.write("consent", {{"op", "PRVAccessSetForBundle"},
                             {"service", service.string()},
                             {"bundle", identifierOf(bundle)},
                             {"granted", granted}});
    return _store.PRVAccessSetForBundle(service, bundle, granted);
}

} // namespace nimbra::host
