#pragma once

#include "platform/host/Presenter.h"

namespace nimbra::host {

class Trace;

/// Traces what a pane asks of its host.
class TracingPresenter final : public Presenter {
public:
    /// Neither is owned; both outlive this one.
    TracingPresenter(Presenter& presenter, Trace& trace) : _presenter(presenter), _trace(trace) {}

    void showActivityInProgress(const Text& message) override;
    void hideActivityInProgress() override;
    void reloadParentSpecifier() override;
    void reloadAllParentSpecifiers() override;
    void dismissPresentedController(bool animated) override;
    void presentController(const std::shared_ptr<SetupController>& controller,
                           bool animated) override;
    void dismissController(const ViewController& controller, bool animated) override;
    void presentAlert(const std::shared_ptr<AlertController>& alert, bool animated) override;
    void showAccountAlert(const std::shared_ptr<AccountAlertView>& alert) override;
    void presentShareSheet(const std::shared_ptr<ShareSheet>& sheet, bool animated) override;

private:
    Presenter& _presenter;
    Trace& _trace;
    /// What was presented last, to know it again.
    std::weak_ptr<const ViewController> _presented;
    /// It lives as long as it is shown.
    std::weak_ptr<const ShareSheet> _sheet;
};

} // namespace nimbra::host
