#pragma once

#include "platform/system/DeviceInfo.h"

#include <functional>
#include <optional>
#include <string>

namespace nimbra::test {

/// A device with or without cellular data and a wording of its own for wireless networks.
class FakeDeviceInfo final : public DeviceInfo {
public:
    [[nodiscard]] bool boolAnswerForQuestion(const Text& question) const override {
        if (whenAsked) {
            whenAsked();
        }
        return question == Text("cellular-data") && hasCellularData;
    }
    [[nodiscard]] Text copyAnswerForQuestion(const Text& question) const override {
        return question == Text("UserAssignedDeviceName") ? name : Text();
    }
    [[nodiscard]] Text VariantStringKeyForKey(const Text& key) const override {
        return variant.empty() ? key : Text(key.string() + "_" + variant);
    }
    [[nodiscard]] UserInterfaceIdiom userInterfaceIdiom() const override {
        ++idiomQuestions;
        return idiom;
    }
    [[nodiscard]] std::optional<Screen> mainScreen() const override { return screen; }

    bool hasCellularData = false;
    /// Called where a question is asked that has yes or no for an answer.
    std::function<void()> whenAsked;
    Text name{"Phone"};
    std::string variant;
    UserInterfaceIdiom idiom = UserInterfaceIdiom::phone;
    std::optional<Screen> screen = Screen{.bounds = {.origin = {}, .size = {390, 844}}, .scale = 2};
    /// How often the idiom was asked for.
    mutable int idiomQuestions = 0;
};

} // namespace nimbra::test
