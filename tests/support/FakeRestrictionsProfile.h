#pragma once

#include "platform/system/RestrictionsProfile.h"

namespace nimbra::test {

class FakeRestrictionsProfile final : public RestrictionsProfile {
public:
    [[nodiscard]] bool isAppCellularDataModificationAllowed() const override {
        return allowsCellularModification;
    }

    bool allowsCellularModification = true;
};

} // namespace nimbra::test
