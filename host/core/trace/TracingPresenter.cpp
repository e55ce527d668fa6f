#include "host/core/trace/TracingPresenter.h"

#include "host/core/RowDescription.h"
#include "host/core/trace/Trace.h"

namespace nimbra::host {

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

void TracingPresenter::dismissPresentedController(bool animated) {
    // Nothing can be presented over a pane, so there is nothing that the trace could name.
    _presenter.dismissPresentedController(animated);
}

void TracingPresenter::dismissPane(bool animated) {
    _trace.write("dismiss", {{"what", "pane"}, {"animated", animated}});
    _presenter.dismissPane(animated);
}

} // namespace nimbra::host
