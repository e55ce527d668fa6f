#pragma once

#include "platform/values/Text.h"

#include <memory>

namespace nimbra {

class AccountAlertView;
class AlertController;
class SetupController;
class ShareSheet;
class ViewController;

/// What a pane may ask of the host that shows it. Main queue only.
class Presenter {
public:
    virtual ~Presenter() = default;

    /// Covers the pane with a busy indicator and `message`, or changes the message of the one that
    /// is shown.
    virtual void showActivityInProgress(const Text& message) = 0;
    /// Takes the busy indicator away; nothing when there is none.
    virtual void hideActivityInProgress() = 0;

    /// Draws the row anew that opened the pane, on the page above it.
    virtual void reloadParentSpecifier() = 0;
    /// Draws the rows anew that led to the pane, on every page above it.
    virtual void reloadAllParentSpecifiers() = 0;

    /// Shows `controller` over the pane; the host shares it while it is shown. Nothing when a
    /// controller or a share sheet is shown already.
    virtual void presentController(const std::shared_ptr<SetupController>& controller,
                                   bool animated) = 0;
    /// Takes away what the pane has presented over itself last, a share sheet or a controller with
    /// the alerts over that; nothing when there is none.
    virtual void dismissPresentedController(bool animated) = 0;
    /// Takes away `controller` itself, the pane or what was presented over it, and returns to the
    /// page that led there; nothing when it is not shown.
    virtual void dismissController(const ViewController& controller, bool animated) = 0;

    /// Asks the user with an alert, over all that is shown. The host shares it until the user has
    /// answered, takes it away and then calls the action chosen. Nothing when the pane has gone.
    virtual void presentAlert(const std::shared_ptr<AlertController>& alert, bool animated) = 0;
    /// The same with an alert about an account, which also stands when the controller that shows it
    /// has been dismissed.
    virtual void showAccountAlert(const std::shared_ptr<AccountAlertView>& alert) = 0;

    /// Offers the user to share something, over all that is shown. The host shares the sheet while
    /// it is shown, calls its handler when the user has shared or given up, and leaves it to the
    /// pane to dismiss it. Nothing when a share sheet is shown already, or the pane has gone.
    virtual void presentShareSheet(const std::shared_ptr<ShareSheet>& sheet, bool animated) = 0;
};

} // namespace nimbra
