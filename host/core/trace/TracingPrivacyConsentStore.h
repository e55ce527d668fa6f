#pragma once

#include "platform/privacy/PrivacyConsentStore.h"

#include <optional>

namespace nimbra::host {

class Trace;

/// Traces what is asked of another consent store.
class TracingPrivacyConsentStore final : public PrivacyConsentStore {
public:
    /// Neither is owned; both outlive this one.
    TracingPrivacyConsentStore(PrivacyConsentStore& store, Trace& trace)
        : _store(store), _trace(trace) {}

    [[nodiscard]] std::optional<PrivacyAccessRecords>
    PRVAccessCopyInformation(const PrivacyService& service) override;
    [[nodiscard]] bool PRVAccessSetForBundle(const PrivacyService& service, const Bundle* bundle,
                                             bool granted) override;

private:
    PrivacyConsentStore& _store;
    Trace& _trace;
};

} // namespace nimbra::host
