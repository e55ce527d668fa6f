#include "host/core/trace/TracingPresenter.h"

#include "host/core/trace/Trace.h"

namespace nimbra::host {

void TracingPresenter::dismissPresentedController(bool animated) {
    // Nothing can be presented over a pane, so there is nothing that the trace could name.
    _presenter.dismissPresentedController(animated);
}

void TracingPresenter::dismissPane(bool animated) {
    _trace.write("dismiss", {{"what", "pane"}, {"animated", animated}});
    _presenter.dismissPane(animated);
}

} // namespace nimbra::host
