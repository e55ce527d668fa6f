#pragma once

#include <memory>

namespace nimbra {

class RSPUpgradeViewController;

/// Is told how the screen that moves an account to the new document service has ended, on the main
/// queue, each time the screen comes to an end; not where it ends with the page that it was opened
/// from.
class RSPUpgradeViewControllerDelegate {
public:
    virtual ~RSPUpgradeViewControllerDelegate() = default;

    /// The user left `screen`, or the upgrade failed and the user has been told so.
    virtual void
    upgradeViewControllerDidCancel(const std::shared_ptr<RSPUpgradeViewController>& screen) = 0;
    /// The account has moved.
    virtual void
    upgradeViewControllerDidSucceed(const std::shared_ptr<RSPUpgradeViewController>& screen) = 0;
};

} // namespace nimbra
