#pragma once

#include "platform/privacy/PrivacyConsentStore.h"

#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace nimbra::test {

/// Consent records that a test lists; notes in `calls` what is asked of it.
class FakePrivacyConsentStore final : public PrivacyConsentStore {
public:
    explicit FakePrivacyConsentStore(std::vector<std::string>& calls) : _calls(calls) {}

    [[nodiscard]] std::optional<PrivacyAccessRecords>
    PRVAccessCopyInformation(const PrivacyService& service) override {
        _calls.push_back("copy " + service.string());
        onCopy();
        return unreadable.contains(service) ? std::nullopt : std::optional(records[service]);
    }

    [[nodiscard]] bool PRVAccessSetForBundle(const PrivacyService& service, const Bundle* bundle,
                                             bool granted) override {
        const std::string name =
            bundle != nullptr && bundle->identifier() ? bundle->identifier()->string() : "nobody";
        _calls.push_back("set " + service.string() + ' ' + name + (granted ? " on" : " off"));
        lastBundle = bundle;
        onSet();
        return !refuses;
    }

    std::map<PrivacyService, PrivacyAccessRecords> records;
    /// The services whose records cannot be read.
    std::set<PrivacyService> unreadable;
    bool refuses = false;
    /// What the last record that was set was set for.
    const Bundle* lastBundle = nullptr;
    /// Called while the store is read, and while it is written.
    std::function<void()> onCopy = [] {};
    std::function<void()> onSet = [] {};

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
