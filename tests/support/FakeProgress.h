#pragma once

#include "platform/documents/ProgressReport.h"

#include <functional>
#include <string>
#include <vector>

namespace nimbra::test {

/// A progress whose values a test sets and tells of; writes down who observes it.
class FakeProgress final : public ProgressReport {
public:
    UserInfo info;
    bool indeterminate = false;
    double fraction = 0;
    Text description;
    Text additional;
    /// What was asked, in order: "add KEYPATH OPTIONS", "remove KEYPATH".
    std::vector<std::string> calls;
    /// The contexts that observers came with, in order.
    std::vector<void*> contexts;
    /// Called where an observer is removed, to see how things stand at that moment.
    std::function<void()> whenRemoved;

    [[nodiscard]] const UserInfo& userInfo() const override { return info; }
    [[nodiscard]] bool isIndeterminate() const override { return indeterminate; }
    [[nodiscard]] double fractionCompleted() const override { return fraction; }
    [[nodiscard]] Text localizedDescription() const override { return description; }
    [[nodiscard]] Text localizedAdditionalDescription() const override { return additional; }

    void addObserver(const std::shared_ptr<KeyValueObserver>& observer,
                     const Registration& registration) override {
        calls.push_back("add " + registration.forKeyPath.string() + ' ' +
                        std::to_string(static_cast<int>(registration.options)));
        contexts.push_back(registration.context);
        _observer = observer;
        if (registration.options == KeyValueObservingOptions::initial) {
            tell(registration.forKeyPath);
        }
    }
    void removeObserverForKeyPath(const KeyValueObserver& /*observer*/,
                                  const KeyPath& keyPath) override {
        calls.push_back("remove " + keyPath.string());
        if (whenRemoved) {
            whenRemoved();
        }
    }

    /// Tells the observer that the value named `keyPath` has changed.
    void tell(const KeyPath& keyPath) {
        if (const auto observer = _observer.lock()) {
            observer->observeValueForKeyPath(keyPath, {.ofObject = *this, .change = {}});
        }
    }

private:
    std::weak_ptr<KeyValueObserver> _observer;
};

} // namespace nimbra::test
