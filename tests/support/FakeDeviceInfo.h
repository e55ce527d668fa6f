#pragma once

#include "platform/system/DeviceInfo.h"

#include <string>

namespace nimbra::test {

/// A device with or without cellular data and a wording of its own for wireless networks.
class FakeDeviceInfo final : public DeviceInfo {
public:
    [[nodiscard]] bool boolAnswerForQuestion(const Text& question) const override {
        return question == Text("cellular-data") && hasCellularData;
    }
    [[nodiscard]] Text VariantStringKeyForKey(const Text& key) const override {
        return variant.empty() ? key : Text(key.string() + "_" + variant);
    }

    bool hasCellularData = false;
    std::string variant;
};

} // namespace nimbra::test
