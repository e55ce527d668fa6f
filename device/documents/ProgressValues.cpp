#include "device/documents/ProgressValues.h"

namespace nimbra::device {

void ProgressChanges::merge(const ProgressChanges& later) {
    for (const ProgressKey key : later.keys) {
        std::erase(keys, key);
        keys.push_back(key);
        copy(key, later.values, values);
    }
}

ProgressChanges ProgressChanges::between(const ProgressValues& before,
                                         const ProgressValues& after) {
    ProgressChanges changes{.values = after, .keys = {}};
    using enum ProgressKey;
    for (const ProgressKey key :
         {fileOperationKind, description, additional, indeterminate, fraction}) {
        ProgressValues changed = before;
        copy(key, after, changed);
        if (changed != before) {
            changes.keys.push_back(key);
        }
    }
    return changes;
}

void ProgressChanges::copy(ProgressKey key, const ProgressValues& from, ProgressValues& values) {
    switch (key) {
    case ProgressKey::fileOperationKind:
        values.fileOperationKind = from.fileOperationKind;
        break;
    case ProgressKey::fraction:
        values.fraction = from.fraction;
        break;
    case ProgressKey::indeterminate:
        values.indeterminate = from.indeterminate;
        break;
    case ProgressKey::description:
        values.description = from.description;
        break;
    case ProgressKey::additional:
        values.additional = from.additional;
        break;
    }
}

} // namespace nimbra::device
