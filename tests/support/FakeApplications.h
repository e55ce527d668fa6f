#pragma once

#include "platform/apps/Applications.h"

#include <map>
#include <memory>

namespace nimbra::test {

/// An application as a test describes it.
class FakeApp final : public AppProxy {
public:
    [[nodiscard]] bool isRemovedSystemApp() const override { return isRemoved; }
    [[nodiscard]] const Entitlements& entitlements() const override { return granted; }
    [[nodiscard]] Text localizedName() const override { return name; }

    Text name;
    bool isRemoved = false;
    Entitlements granted;
};

/// The applications that a test installs.
class FakeApplications final : public Applications {
public:
    [[nodiscard]] std::shared_ptr<const AppProxy>
    applicationProxyForIdentifier(const BundleIdentifier& identifier) override {
        const auto app = installed.find(identifier);
        return app != installed.end() ? app->second : nullptr;
    }

    /// Installs an application, to be described further.
    FakeApp& install(const char* identifier, Text name) {
        const auto app = std::make_shared<FakeApp>();
        app->name = std::move(name);
        installed.insert_or_assign(BundleIdentifier(identifier), app);
        return *app;
    }

    std::map<BundleIdentifier, std::shared_ptr<FakeApp>> installed;
};

} // namespace nimbra::test
