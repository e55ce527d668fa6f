#pragma once

#include "host/core/AccountPage.h"

#include <optional>
#include <vector>

namespace nimbra::host {

class PaneSession;

/// What the store holds of an account at one moment. Main queue.
struct AccountFlags {
    bool usesStratafile = false;
    /// Of each data class: whether it is provisioned, is enabled, and may use cellular data.
    std::vector<bool> dataclasses;

    /// Of the account that a pane is opened on by `entry`; nothing where the store has none, or
    /// cannot be read.
    [[nodiscard]] static std::optional<AccountFlags> of(PaneSession& session,
                                                        const PaneEntry& entry);

    friend bool operator==(const AccountFlags&, const AccountFlags&) = default;
};

} // namespace nimbra::host
