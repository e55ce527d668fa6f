#include "device/documents/DeviceProgress.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace nimbra::device {

/// One registration. Whoever is telling holds it, so it also knows when it has ended.
struct DeviceProgress::Observer {
    std::weak_ptr<KeyValueObserver> observer;
    Registration registration;
    bool ended = false;
};

DeviceProgress::DeviceProgress(ProgressValues values) : _values(std::move(values)) {
    valuesChanged();
}

void DeviceProgress::apply(const ProgressChanges& changes) {
    for (const ProgressKey key : changes.keys) {
        ProgressChanges::copy(key, changes.values, _values);
        valuesChanged();
        switch (key) {
        case ProgressKey::fileOperationKind:
            // Not among the values that can be observed.
            break;
        case ProgressKey::fraction:
        case ProgressKey::indeterminate:
            tell(fractionCompletedKeyPath);
            break;
        case ProgressKey::description:
            tell(localizedDescriptionKeyPath);
            break;
        case ProgressKey::additional:
            tell(localizedAdditionalDescriptionKeyPath);
            break;
        }
    }
}

void DeviceProgress::addObserver(const std::shared_ptr<KeyValueObserver>& observer,
                                 const Registration& registration) {
    const auto added = std::make_shared<Observer>(observer, registration);
    _observers.push_back(added);
    if (registration.options == KeyValueObservingOptions::initial) {
        tell(*added, {.isInitial = true});
    }
}

void DeviceProgress::removeObserverForKeyPath(const KeyValueObserver& observer,
                                              const KeyPath& keyPath) {
    const auto newest = std::ranges::find_if(
        _observers.rbegin(), _observers.rend(), [&](const std::shared_ptr<Observer>& candidate) {
            // Where an observer has gone, another one may stand at its address.
            return candidate->registration.forKeyPath == keyPath &&
                   candidate->observer.lock().get() == &observer;
        });
    if (newest != _observers.rend()) {
        (*newest)->ended = true;
        _observers.erase(std::next(newest).base());
    }
}

void DeviceProgress::valuesChanged() {
    // What is not a number is none of the comparisons' concern: it counts as nothing done.
    _values.fraction = _values.fraction > 0 ? std::min(_values.fraction, 1.0) : 0.0;
    _userInfo.clear();
    if (_values.fileOperationKind) {
        _userInfo[ProgressFileOperationKindKey] = _values.fileOperationKind;
    }
}

void DeviceProgress::tell(const KeyPath& keyPath) {
    std::erase_if(_observers, [](const auto& observer) { return observer->observer.expired(); });
    std::vector<std::shared_ptr<Observer>> told;
    std::ranges::copy_if(_observers, std::back_inserter(told), [&keyPath](const auto& observer) {
        return observer->registration.forKeyPath == keyPath;
    });
    for (const auto& observer : told) {
        if (!observer->ended) {
            tell(*observer, {});
        }
    }
}

void DeviceProgress::tell(const Observer& observer, KeyValueChange change) {
    if (const auto alive = observer.observer.lock()) {
        alive->observeValueForKeyPath(
            observer.registration.forKeyPath,
            {.ofObject = *this, .change = change, .context = observer.registration.context});
    }
}

} // namespace nimbra::device
