#pragma once

#include "platform/values/Identifier.h"

#include <cstdint>
#include <memory>

namespace nimbra {

/// Names a value of an object that can be observed.
using KeyPath = Identifier<struct KeyPathKind>;

/// When and how an observer is told; the numbers are the platform's.
enum class KeyValueObservingOptions : std::uint8_t {
    none = 0,
    /// Tells the observer at once, with the value as it is.
    initial = 4
};

/// What a change record says. Observers ask the object itself for its values.
struct KeyValueChange {
    /// Whether the observer is told of the value as it was when it registered.
    bool isInitial = false;
};

class KeyValueObserver;

/// An object whose values can be observed. Registering and the values' changes call back on the
/// queue that the object's class names.
class KeyValueObservable {
public:
    struct Registration {
        KeyPath forKeyPath;
        KeyValueObservingOptions options = KeyValueObservingOptions::none;
        /// Handed back with each change, and not looked at.
        void* context = nullptr;
    };

    KeyValueObservable() = default;
    KeyValueObservable(const KeyValueObservable&) = delete;
    KeyValueObservable& operator=(const KeyValueObservable&) = delete;
    virtual ~KeyValueObservable() = default;

    /// Tells `observer`, which is held weakly, of each change of the value until it is removed.
    /// Registering twice tells it twice.
    virtual void addObserver(const std::shared_ptr<KeyValueObserver>& observer,
                             const Registration& registration) = 0;

    /// Ends the newest registration of `observer` for `keyPath`; nothing where there is none.
    virtual void removeObserverForKeyPath(const KeyValueObserver& observer,
                                          const KeyPath& keyPath) = 0;
};

/// Is told when a value of an object changes.
class KeyValueObserver {
public:
    struct Observation {
        KeyValueObservable& ofObject;
        KeyValueChange change;
        void* context = nullptr;
    };

    virtual ~KeyValueObserver() = default;

    /// The value named `keyPath` has changed.
    virtual void observeValueForKeyPath(const KeyPath& keyPath, const Observation& observation) = 0;
};

} // namespace nimbra
