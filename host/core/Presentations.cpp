#include "host/core/Presentations.h"

#include "platform/host/AccountAlertView.h"
#include "platform/host/SettingsListController.h"
#include "platform/host/SetupController.h"
#include "platform/views/Button.h"
#include "platform/views/View.h"

#include <algorithm>
#include <utility>

namespace nimbra::host {

namespace {

using Refused = std::unexpected<std::string>;

std::string quoted(std::string_view text) {
    return '"' + std::string(text) + '"';
}

/// Whether the user can see the view, as far as it alone says.
bool canBeSeen(const View& view) {
    return !view.isHidden() && view.alpha() > 0;
}

bool isUsable(const Button& button) {
    return button.isEnabled() && button.isUserInteractionEnabled() && canBeSeen(button);
}

/// The first button in `view` of which `isMeant` is true; null where there is none.
template <class IsMeant>
// NOLINTNEXTLINE(misc-no-recursion): a tree
std::shared_ptr<Button> findButton(const std::shared_ptr<View>& view, const IsMeant& isMeant) {
    if (auto button = std::dynamic_pointer_cast<Button>(view)) {
        return isMeant(*button) ? button : nullptr;
    }
    for (const std::shared_ptr<View>& subview : view->subviews()) {
        if (auto found = findButton(subview, isMeant)) {
            return found;
        }
    }
    return nullptr;
}

bool isCalled(const Text& text, std::string_view title) {
    return text && text.string() == title;
}

} // namespace

void Presentations::present(const std::shared_ptr<SetupController>& controller) {
    if (_presented || _sheet) {
        return;
    }
    _presented = controller;
    const auto shown = screen();
    shown->loadViewIfNeeded();
    shown->view()->moveToWindow(&_window);
    shown->viewDidAppear(true);
}

void Presentations::present(const std::shared_ptr<AlertController>& alert) {
    _alerts.push_back(std::make_shared<ShownAlert>(ShownAlert{
        .title = alert->title(), .message = alert->message(), .actions = alert->actions()}));
}

void Presentations::present(const std::shared_ptr<AccountAlertView>& alert) {
    const AccountAlertView::Content& content = alert->content();
    _alerts.push_back(
        std::make_shared<ShownAlert>(ShownAlert{.title = alert->title(),
                                                .message = content.message,
                                                .actions = {{.title = content.buttonTitle,
                                                             .style = AlertActionStyle::standard,
                                                             .handler = content.action}},
                                                .isOfAccount = true}));
}

void Presentations::present(const std::shared_ptr<ShareSheet>& sheet) {
    if (!_sheet) {
        _sheet = sheet;
    }
}

void Presentations::dismissLast() {
    if (_sheet) {
        _sheet.reset();
        return;
    }
    dismissScreen();
}

void Presentations::dismissScreen() {
    const auto dismissed = std::exchange(_presented, nullptr);
    if (!dismissed) {
        return;
    }
    const auto page = dismissed->rootViewController();
    page->viewDidDisappear(true);
    page->view()->moveToWindow(nullptr);
    std::erase_if(_alerts, [](const auto& alert) { return !alert->isOfAccount; });
}

void Presentations::dismissAll() {
    _sheet.reset();
    dismissScreen();
    _alerts.clear();
}

std::shared_ptr<SettingsListController> Presentations::screen() const {
    return _presented ? _presented->rootViewController() : nullptr;
}

std::shared_ptr<const ShownAlert> Presentations::alert() const {
    return _alerts.empty() ? nullptr : _alerts.back();
}

std::expected<void, std::string> Presentations::answerAlert(std::string_view title) {
    if (_alerts.empty()) {
        return Refused("no alert is shown");
    }
    const std::vector<AlertAction>& actions = _alerts.back()->actions;
    const auto chosen = std::ranges::find_if(
        actions, [title](const AlertAction& action) { return isCalled(action.title, title); });
    if (chosen == actions.end()) {
        std::string known;
        for (const AlertAction& action : actions) {
            known += (known.empty() ? "" : ", ") + quoted(action.title.string());
        }
        return Refused("the alert has no answer " + quoted(title) + " (answers: " + known + ')');
    }
    answerAlert(static_cast<std::size_t>(chosen - actions.begin()));
    return {};
}

void Presentations::answerAlert(std::size_t action) {
    const auto handler = _alerts.back()->actions.at(action).handler;
    _alerts.pop_back();
    if (handler) {
        handler();
    }
}

std::expected<void, std::string> Presentations::endSharing(ShareOutcome outcome) {
    // A hold, as the handler dismisses the sheet.
    const auto sheet = _sheet;
    if (!sheet) {
        return Refused("no share sheet is presented");
    }
    if (const auto& handler = sheet->completionWithItemsHandler()) {
        handler(outcome);
    }
    return {};
}

std::shared_ptr<Button> Presentations::usableButton() const {
    const auto shown = screen();
    return shown && _alerts.empty() && !_isBusy ? findButton(shown->view(), isUsable) : nullptr;
}

std::expected<void, std::string> Presentations::touchButton(std::string_view title) {
    const auto shown = screen();
    if (!shown) {
        return Refused("no screen is presented");
    }
    if (!_alerts.empty()) {
        return Refused("an alert covers the screen");
    }
    if (_isBusy) {
        return Refused("the page is busy");
    }
    if (title == "cancel") {
        return touchCancel(*shown);
    }
    const auto isMeant = [title](const Button& button) {
        return isCalled(button.titleForState(ControlState::normal), title);
    };
    const auto button = findButton(shown->view(), [&isMeant](const Button& candidate) {
        return isMeant(candidate) && isUsable(candidate);
    });
    if (button) {
        button->touch();
        return {};
    }
    const auto unusable = findButton(shown->view(), isMeant);
    if (!unusable) {
        return Refused("the screen has no button " + quoted(title));
    }
    return Refused("the button " + quoted(title) +
                   (unusable->isEnabled() ? " cannot be touched" : " is disabled"));
}

std::expected<void, std::string> Presentations::touchCancel(SettingsListController& screen) {
    // A copy, as the screen may go with it.
    const std::optional<BarButtonItem> item = screen.navigationItem().leftBarButtonItem();
    if (!item || item->systemItem != BarButtonSystemItem::cancel || !item->action) {
        return Refused("the screen's bar has no cancel button");
    }
    item->action(*item);
    return {};
}

void Presentations::layOut() const {
    if (const auto shown = screen()) {
        shown->layoutViewIfNeeded();
    }
}

void Presentations::layOut(const Size& size) const {
    const auto shown = screen();
    View& root = *shown->view();
    root.setFrame({.origin = root.frame().origin, .size = size});
    root.setNeedsLayout();
    shown->layoutViewIfNeeded();
}

} // namespace nimbra::host
