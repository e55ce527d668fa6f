#pragma once

#include "platform/documents/ProgressReport.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// Watches a progress, and writes down each call with the values of that moment.
struct ProgressObserver final : KeyValueObserver {
    /// "KEY fraction", "indeterminate" in the fraction's place, a "!" behind an initial call.
    std::vector<std::string> calls;
    /// Called after each call was written down.
    std::function<void(KeyValueObservable&)> then;
    void* context = nullptr;

    void observeValueForKeyPath(const KeyPath& keyPath, const Observation& observation) override {
        const auto& progress = dynamic_cast<const ProgressReport&>(observation.ofObject);
        calls.push_back(keyPath.string() + ' ' + valueIn(progress, keyPath) +
                        (observation.change.isInitial ? "!" : ""));
        context = observation.context;
        if (then) {
            // A copy, as it may be replaced within.
            const auto called = then;
            called(observation.ofObject);
        }
    }

    static std::string valueIn(const ProgressReport& progress, const KeyPath& keyPath) {
        if (keyPath == localizedDescriptionKeyPath) {
            return progress.localizedDescription().string();
        }
        if (keyPath == localizedAdditionalDescriptionKeyPath) {
            return progress.localizedAdditionalDescription().string();
        }
        const auto percent = static_cast<int>(progress.fractionCompleted() * 100);
        return progress.isIndeterminate() ? "indeterminate" : std::to_string(percent) + '%';
    }
};

} // namespace nimbra::test
