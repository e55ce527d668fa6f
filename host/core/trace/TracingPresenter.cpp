#include "host/core/trace/TracingPresenter.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"
#include "platform/host/AccountAlertView.h"
#include "platform/host/AlertController.h"
#include "platform/host/SettingsListController.h"
#include "platform/host/SetupController.h"
#include "platform/host/ShareSheet.h"
#include "platform/views/TableCell.h"

#include <utility>

namespace nimbra::host {

namespace {

nlohmann::ordered_json actionJson(const Text& title, AlertActionStyle style) {
    return {{"title", jsonOf(title)},
            {"style", style == AlertActionStyle::cancel ? "cancel" : "default"}};
}

} // namespace

void TracingPresenter::showActivityInProgress(const Text& message) {
    _trace.write("busy", {{"shown", true}, {"message", jsonOf(message)}});
    _presenter.showActivityInProgress(message);
}

void TracingPresenter::hideActivityInProgress() {
    _trace.write("busy", {{"shown", false}});
    _presenter.hideActivityInProgress();
}

void TracingPresenter::reloadParentSpecifier() {
    _trace.write("parent", {{"op", "reloadParentSpecifier"}});
    _presenter.reloadParentSpecifier();
}

void TracingPresenter::reloadAllParentSpecifiers() {
    _trace.write("parent", {{"op", "reloadAllParentSpecifiers"}});
    _presenter.reloadAllParentSpecifiers();
}

void TracingPresenter::presentController(const std::shared_ptr<SetupController>& controller,
                                         bool animated) {
    _presented = controller->rootViewController();
    _trace.write("present", {{"what", "upgrade"},
                             {"animated", animated},
                             {"style", static_cast<int>(controller->modalPresentationStyle())}});
    _presenter.presentController(controller, animated);
}

void TracingPresenter::dismissPresentedController(bool animated) {
    _trace.write("dismiss",
                 {{"what", _sheet.expired() ? "upgrade" : "share"}, {"animated", animated}});
    _presenter.dismissPresentedController(animated);
}

void TracingPresenter::dismissController(const ViewController& controller, bool animated) {
    _trace.write("dismiss", {{"what", &controller == _presented.lock().get() ? "upgrade" : "pane"},
                             {"animated", animated}});
    _presenter.dismissController(controller, animated);
}

void TracingPresenter::presentAlert(const std::shared_ptr<AlertController>& alert, bool animated) {
    auto actions = nlohmann::ordered_json::array();
    for (const AlertAction& action : alert->actions()) {
        actions.push_back(actionJson(action.title, action.style));
    }
    _trace.write("present", {{"what", "alert"},
                             {"animated", animated},
                             {"title", jsonOf(alert->title())},
                             {"message", jsonOf(alert->message())},
                             {"actions", std::move(actions)}});
    _presenter.presentAlert(alert, animated);
}

void TracingPresenter::showAccountAlert(const std::shared_ptr<AccountAlertView>& alert) {
    // Such an alert always comes with an animation.
    _trace.write("present",
                 {{"what", "accountAlert"},
                  {"animated", true},
                  {"title", jsonOf(alert->title())},
                  {"message", jsonOf(alert->content().message)},
                  {"actions", nlohmann::ordered_json::array({actionJson(
                                  alert->content().buttonTitle, AlertActionStyle::standard)})}});
    _presenter.showAccountAlert(alert);
}

void TracingPresenter::presentShareSheet(const std::shared_ptr<ShareSheet>& sheet, bool animated) {
    auto items = nlohmann::ordered_json::array();
    for (const FileURL& item : sheet->activityItems()) {
        items.push_back(item.path());
    }
    auto activities = nlohmann::ordered_json::array();
    for (const ActivityType& type :
         sheet->includedActivityTypes().value_or(std::vector<ActivityType>())) {
        activities.push_back(type.string());
    }
    const auto anchor = std::dynamic_pointer_cast<const TableCell>(
        sheet->popoverPresentationController().sourceView);
    _sheet = sheet;
    _trace.write("present", {{"what", "share"},
                             {"animated", animated},
                             {"items", std::move(items)},
                             {"activities", std::move(activities)},
                             {"anchor", anchor ? jsonOf(anchor->label()) : nullptr}});
    _presenter.presentShareSheet(sheet, animated);
}

} // namespace nimbra::host
