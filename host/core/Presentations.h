#pragma once

#include "platform/host/AlertController.h"
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

/// What stands over a pane: a screen in a sheet, and alerts over both. Main queue.
class Presentations {
public:
    /// Shows the controller's page, in a window of its own, over the pane. One at a time: where
    /// there is one already, nothing happens.
    void present(const std::shared_ptr<SetupController>& controller);
    void present(const std::shared_ptr<AlertController>& alert);
    void present(const std::shared_ptr<AccountAlertView>& alert);

    /// Takes the screen away, and the alerts with which it asks; nothing when there is none.
    void dismissScreen();
    /// Takes all away.
    void dismissAll();

    /// The page that is shown over the pane; null for none.
    [[nodiscard]] std::shared_ptr<SettingsListController> screen() const;
    /// The alert on top, the same object as long as it stands; null for none.
    [[nodiscard]] std::shared_ptr<const ShownAlert> alert() const;

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
    /// The one on top last.
    std::vector<std::shared_ptr<const ShownAlert>> _alerts;
    bool _isBusy = false;
};

} // namespace nimbra::host
