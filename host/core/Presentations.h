#pragma once

#include "platform/host/AlertController.h"
#include "platform/host/ShareSheet.h"
#include "platform/values/Text.h"
#include "platform/views/Geometry.h"
#include "platform/views/Window.h"

#include <cstddef>
#include <expected>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra {
class AccountAlertView;
class Button;
class SettingsListController;
class SetupController;
class View;
class ViewController;
} // namespace nimbra

namespace nimbra::host {

/// An alert as the user sees it.
struct ShownAlert {
    Text title;
    Text message;
    std::vector<AlertAction> actions;
    /// Whether it tells something about an account, instead of asking for the page under it.
    bool isOfAccount = false;
};

/// What stands over a pane: a screen in a sheet or something to be shared, and alerts over both.
/// Main queue.
class Presentations {
public:
    /// Shows the controller's page, in a window of its own, over the pane. Where there is one
    /// already, or a share sheet, nothing happens: the pane can present one thing only.
    void present(const std::shared_ptr<SetupController>& controller);
    /// Puts the alert over all that is shown.
    void present(const std::shared_ptr<AlertController>& alert);
    void present(const std::shared_ptr<AccountAlertView>& alert);
    /// Also over a screen that came while the sheet was made ready; nothing where there is one.
    void present(const std::shared_ptr<ShareSheet>& sheet);

    /// Takes away what was presented last, the share sheet or the screen; nothing when there is
    /// neither.
    void dismissLast();
    /// Takes the screen away, and the alerts with which it asks; nothing when there is none.
    void dismissScreen();
    /// Takes all away.
    void dismissAll();

    /// The page that is shown over the pane; null for none.
    [[nodiscard]] std::shared_ptr<SettingsListController> screen() const;
    /// The alert on top, the same object as long as it stands; null for none.
    [[nodiscard]] std::shared_ptr<const ShownAlert> alert() const;

    /// What the user is offered to share; null for nothing.
    [[nodiscard]] const std::shared_ptr<ShareSheet>& shareSheet() const { return _sheet; }
    /// The user has shared, or given up: the pane is told, which then dismisses the sheet. Refused,
    /// with the reason, where there is none.
    [[nodiscard]] std::expected<void, std::string> endSharing(ShareOutcome outcome);

    /// While the pane is busy, its sign covers the screen.
    void setBusy(bool isBusy) { _isBusy = isBusy; }

    /// Takes the alert on top away with one of its answers, counted from 0. There is an alert.
    void answerAlert(std::size_t action);
    /// The same with the answer of this title. Refused, with the reason, where there is no alert or
    /// it has no such answer.
    [[nodiscard]] std::expected<void, std::string> answerAlert(std::string_view title);

    /// The first button of the screen that the user can touch now; null for none.
    [[nodiscard]] std::shared_ptr<Button> usableButton() const;
    /// Touches the button of the screen with this title, or for "cancel" the one of its bar.
    /// Refused, with the reason, where the user could not do that now.
    [[nodiscard]] std::expected<void, std::string> touchButton(std::string_view title);

    /// Runs a layout pass of the screen where it asks for one.
    void layOut() const;
    /// Gives the screen this size and runs one layout pass. There is a screen.
    void layOut(const Size& size) const;

private:
    [[nodiscard]] static std::expected<void, std::string>
    touchCancel(SettingsListController& screen);

    Window _window;
    std::shared_ptr<SetupController> _presented;
    std::shared_ptr<ShareSheet> _sheet;
    /// The one on top last.
    std::vector<std::shared_ptr<const ShownAlert>> _alerts;
    bool _isBusy = false;
};

} // namespace nimbra::host
