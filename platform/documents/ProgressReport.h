#pragma once

#include "platform/values/KeyValueObserver.h"
#include "platform/values/Text.h"
#include "platform/values/UserInfo.h"

namespace nimbra {

/// User info, text: the kind of the file operation that a progress belongs to. The progress of the
/// whole sync has none.
inline const UserInfoKey ProgressFileOperationKindKey{"ProgressFileOperationKindKey"};

// The values of a progress that can be observed.
inline const KeyPath localizedDescriptionKeyPath{"localizedDescription"};
inline const KeyPath localizedAdditionalDescriptionKeyPath{"localizedAdditionalDescription"};
inline const KeyPath fractionCompletedKeyPath{"fractionCompleted"};

/// How far something has come that is published for others to see. A change of `isIndeterminate`
/// is told to observers as one of "fractionCompleted". Main queue only: wherever the work itself is
/// done, its report reaches observers there.
class ProgressReport : public KeyValueObservable {
public:
    [[nodiscard]] virtual const UserInfo& userInfo() const = 0;
    /// Whether nobody knows how much there is to do.
    [[nodiscard]] virtual bool isIndeterminate() const = 0;
    /// From 0 to 1.
    [[nodiscard]] virtual double fractionCompleted() const = 0;
    /// Sentences of whoever publishes the progress, in the user's language; may be absent.
    [[nodiscard]] virtual Text localizedDescription() const = 0;
    [[nodiscard]] virtual Text localizedAdditionalDescription() const = 0;
};

} // namespace nimbra
