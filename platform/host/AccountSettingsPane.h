#pragma once

#include "platform/host/SettingsListController.h"

namespace nimbra {

class AccountStore;

/// The base of the pages that show and edit one account. Main queue only.
class AccountSettingsPane : public SettingsListController {
public:
    using SettingsListController::SettingsListController;

protected:
    /// The store that the page's account comes from.
    [[nodiscard]] AccountStore& accountStore() const { return services().accountStore; }
};

} // namespace nimbra
