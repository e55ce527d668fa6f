#pragma once

#include "platform/host/SettingsListController.h"

#include <memory>
#include <optional>
#include <string>

namespace nimbra::host {

/// On which account a pane is opened, and how.
struct PaneEntry {
    /// The account's identifier; nothing for the device's first account.
    std::optional<std::string> account;
    /// Whether this is the account's first setup; nothing leaves it unsaid.
    std::optional<bool> firstSetup = false;
};

/// The page of an account from which the user opens a pane: one group with the row that leads to
/// it. Main queue only.
class AccountPage final : public SettingsListController {
public:
    /// A page whose row is called `title` and opens a `paneClass`, which the registry owns and
    /// which gets `userInfo`.
    AccountPage(const PlatformServices& services, Text title, const ControllerClass& paneClass,
                UserInfo userInfo);

    [[nodiscard]] const SpecifierArray& specifiers() override;

    /// The row that opens the pane; the same one as long as the page lives.
    [[nodiscard]] const std::shared_ptr<Specifier>& entryRow() const { return _entryRow; }

private:
    std::shared_ptr<Specifier> _entryRow;
};

} // namespace nimbra::host
