#pragma once

#include "platform/apps/AppTerminator.h"

#include <functional>
#include <string>
#include <vector>

namespace nimbra::test {

/// Notes in `calls` which applications are to be ended, and how.
class FakeAppTerminator final : public AppTerminator {
public:
    explicit FakeAppTerminator(std::vector<std::string>& calls) : _calls(calls) {}

    void terminateApplication(const BundleIdentifier& bundle,
                              const Termination& termination) override {
        _calls.push_back("terminate " + bundle.string() + " for " +
                         std::to_string(termination.reason) +
                         (termination.report ? ", reported" : ", not reported") +
                         (termination.description ? ", described" : ""));
        onTermination();
    }

    /// Called while an application is ended.
    std::function<void()> onTermination = [] {};

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
