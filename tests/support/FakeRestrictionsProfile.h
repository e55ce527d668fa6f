#pragma once

#include "platform/system/RestrictionsProfile.h"

#include <set>

namespace nimbra::test {

class FakeRestrictionsProfile final : public RestrictionsProfile {
public:
    [[nodiscard]] bool isAppCellularDataModificationAllowed() const override {
        return allowsCellularModification;
    }

    [[nodiscard]] bool isCloudSyncAllowed(const BundleIdentifier& bundle) const override {
        return !cloudSyncDenied.contains(bundle);
    }

    bool allowsCellularModification = true;
    std::set<BundleIdentifier> cloudSyncDenied;
};

} // namespace nimbra::test
