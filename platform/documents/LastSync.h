#pragma once

#include "platform/values/Date.h"
#include "platform/values/Error.h"
#include "platform/values/Text.h"

#include <expected>
#include <optional>

namespace nimbra {

/// What the cloud-documents framework says of the last sync that was completed. Any queue.
class LastSync {
public:
    virtual ~LastSync() = default;

    /// When it was; nothing when there was none.
    [[nodiscard]] virtual std::expected<std::optional<Date>, Error>
    MRGetLastSyncDateWithError() const = 0;

    /// The sentence that tells a person, in the user's language; absent when there is nothing to
    /// tell.
    [[nodiscard]] virtual std::expected<Text, Error> MRGetLocalizedLastSyncWithError() const = 0;
};

} // namespace nimbra
