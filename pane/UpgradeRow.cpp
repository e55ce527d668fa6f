#include "pane/RSPNimbraDriveViewController.h"
#include "platform/host/SetupController.h"
#include "upgrade/RSPUpgradeViewController.h"

namespace nimbra {

std::shared_ptr<Specifier> RSPNimbraDriveViewController::_createSpecifierForUpgradeButton() {
    const auto row = Specifier::preferenceSpecifierNamed(
        _localizedString("CLOUD_DRIVE_UPGRADE_LINK"), {.target = this, .cell = ButtonCell});
    row->setButtonAction(
        [this](const std::shared_ptr<Specifier>& tapped) { _upgradeButtonWasTapped(tapped); });
    return row;
}

void RSPNimbraDriveViewController::_upgradeButtonWasTapped(
    const std::shared_ptr<Specifier>& /*row*/) {
    const auto pane = std::static_pointer_cast<RSPNimbraDriveViewController>(shared_from_this());
    const auto screen = std::make_shared<RSPUpgradeViewController>(services());
    const auto setup = std::make_shared<SetupController>(screen);
    setup->setParentController(pane);
    setup->setModalPresentationStyle(ModalPresentationStyle::formSheet);
    // The page's own row carries the account.
    screen->setSpecifier(specifier());
    screen->setDelegate(pane);
    screen->setParentController(setup);
    presentViewControllerAnimated(setup, true);
}

} // namespace nimbra
