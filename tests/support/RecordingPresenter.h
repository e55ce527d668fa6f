#pragma once

#include "platform/host/AccountAlertView.h"
#include "platform/host/AlertController.h"
#include "platform/host/Presenter.h"
#include "platform/host/SettingsListController.h"
#include "platform/host/SetupController.h"
#include "platform/host/ShareSheet.h"

#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

/// Notes in words what the pane asks of its host, in a list that other recorders may share.
class RecordingPresenter final : public Presenter {
public:
    explicit RecordingPresenter(std::vector<std::string>& calls) : _calls(calls) {}

    void showActivityInProgress(const Text& message) override {
        _calls.push_back("busy: " + message.string());
    }
    void hideActivityInProgress() override { _calls.emplace_back("not busy"); }
    void reloadParentSpecifier() override { _calls.emplace_back("reload parent row"); }
    void reloadAllParentSpecifiers() override { _calls.emplace_back("reload all parent rows"); }
    void dismissPresentedController(bool animated) override {
        _calls.emplace_back(animated ? "dismiss presented, animated" : "dismiss presented");
    }
    void dismissController(const ViewController& controller, bool animated) override {
        _calls.emplace_back(animated ? "dismiss itself, animated" : "dismiss itself");
        dismissed = &controller;
    }
    void presentController(const std::shared_ptr<SetupController>& controller,
                           bool animated) override {
        _calls.emplace_back(animated ? "present controller, animated" : "present controller");
        const auto& root = controller->rootViewController();
        presentedAsSheet = root && root->isPresentedAsModalSheet();
        presented = controller;
    }
    void presentAlert(const std::shared_ptr<AlertController>& shown, bool animated) override {
        _calls.push_back((animated ? "alert, animated: " : "alert: ") + shown->title().string());
        answersOfAlert = shown->actions().size();
        alert = shown;
    }
    void showAccountAlert(const std::shared_ptr<AccountAlertView>& shown) override {
        _calls.push_back("account alert: " + shown->title().string());
        accountAlert = shown;
    }

    void presentShareSheet(const std::shared_ptr<ShareSheet>& shown, bool animated) override {
        // What it has now, not what it is given later.
        std::string call = animated ? "share, animated:" : "share:";
        for (const FileURL& item : shown->activityItems()) {
            call += ' ' + item.path();
        }
        for (const ActivityType& type :
             shown->includedActivityTypes().value_or(std::vector<ActivityType>())) {
            call += ' ' + type.string();
        }
        call += shown->completionWithItemsHandler() ? ", handled" : "";
        call += shown->popoverPresentationController().sourceView ? ", from a view" : "";
        _calls.push_back(call);
        shareSheet = shown;
    }

    /// What was presented last; a test lets it go, as a host does at its end.
    std::shared_ptr<SetupController> presented;
    /// Whether its root knew that it was in a sheet when it was presented.
    bool presentedAsSheet = false;
    std::shared_ptr<AlertController> alert;
    /// How many answers the alert had when it was presented.
    std::size_t answersOfAlert = 0;
    std::shared_ptr<AccountAlertView> accountAlert;
    std::shared_ptr<ShareSheet> shareSheet;
    /// Who wanted to be dismissed last; not to be used but for its identity.
    const ViewController* dismissed = nullptr;

private:
    std::vector<std::string>& _calls;
};

} // namespace nimbra::test
