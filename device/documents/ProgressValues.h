#pragma once

#include "platform/values/Text.h"

#include <vector>

namespace nimbra::device {

/// What a progress says of itself.
struct ProgressValues {
    /// Absent for the progress of the whole sync.
    Text fileOperationKind;
    /// From 0 to 1.
    double fraction = 0;
    bool indeterminate = false;
    /// In the user's language; may be absent.
    Text description;
    Text additional;

    friend bool operator==(const ProgressValues&, const ProgressValues&) = default;
};

enum class ProgressKey { fileOperationKind, fraction, indeterminate, description, additional };

/// Values of a progress that are set anew, one after the other.
struct ProgressChanges {
    /// Only the values of `keys` count.
    ProgressValues values;
    /// In the order in which they are set, no key twice.
    std::vector<ProgressKey> keys;

    /// Adds what `later` sets; of a key that both set the later value counts, in the later place.
    void merge(const ProgressChanges& later);
    /// The keys whose values differ, with those of `after`.
    [[nodiscard]] static ProgressChanges between(const ProgressValues& before,
                                                 const ProgressValues& after);
    /// Sets the value of `key` in `values` to the one of `from`.
    static void copy(ProgressKey key, const ProgressValues& from, ProgressValues& values);
};

} // namespace nimbra::device
