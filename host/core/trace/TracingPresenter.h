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
    void dismissPane(bool animated) override;

private:
    Presenter& _presenter;
    Trace& _trace;
};

} // namespace nimbra::host
