#pragma once

#include "platform/system/Bundles.h"

#include <memory>

namespace nimbra::host {

class Trace;

/// Traces that other bundles, which were found at their paths, are to be loaded.
class TracingBundles final : public Bundles {
public:
    /// Neither is owned; both outlive this one, and `trace` its bundles as well.
    TracingBundles(Bundles& bundles, Trace& trace) : _bundles(bundles), _trace(trace) {}

    [[nodiscard]] std::shared_ptr<Bundle>
    bundleWithIdentifier(const BundleIdentifier& identifier) const override;
    [[nodiscard]] std::shared_ptr<Bundle> bundleWithPath(const Text& path) override;
    [[nodiscard]] std::shared_ptr<Bundle>
    bundleForClass(const std::type_info& classType) const override;

private:
    Bundles& _bundles;
    Trace& _trace;
};

} // namespace nimbra::host
