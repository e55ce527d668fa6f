#include "platform/host/AccountAlertView.h"

#include "platform/host/Presenter.h"

namespace nimbra {

void AccountAlertView::show() {
    _services.presenter->showAccountAlert(shared_from_this());
}

} // namespace nimbra
