#pragma once

#include "device/documents/ProgressValues.h"
#include "platform/documents/ProgressReport.h"

#include <memory>
#include <vector>

namespace nimbra::device {

/// A progress that somebody publishes. Main queue only; its observers may come and go, and change
/// nothing else, while they are told.
class DeviceProgress final : public ProgressReport {
public:
    explicit DeviceProgress(ProgressValues values);

    /// Sets the values one after the other and tells the observers of each that can be observed,
    /// also of one that was the same before. A fraction outside 0 to 1 becomes the nearer of the
    /// two, what is no number 0.
    void apply(const ProgressChanges& changes);

    [[nodiscard]] const UserInfo& userInfo() const override { return _userInfo; }
    [[nodiscard]] bool isIndeterminate() const override { return _values.indeterminate; }
    [[nodiscard]] double fractionCompleted() const override { return _values.fraction; }
    [[nodiscard]] Text localizedDescription() const override { return _values.description; }
    [[nodiscard]] Text localizedAdditionalDescription() const override {
        return _values.additional;
    }

    void addObserver(const std::shared_ptr<KeyValueObserver>& observer,
                     const Registration& registration) override;
    void removeObserverForKeyPath(const KeyValueObserver& observer,
                                  const KeyPath& keyPath) override;

private:
    struct Observer;

    void valuesChanged();
    void tell(const KeyPath& keyPath);
    void tell(const Observer& observer, KeyValueChange change);

    ProgressValues _values;
    UserInfo _userInfo;
    /// In the order of their registrations.
    std::vector<std::shared_ptr<Observer>> _observers;
};

} // namespace nimbra::device
