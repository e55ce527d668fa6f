#include "platform/host/ViewController.h"

#include "platform/host/Presenter.h"
#include "platform/host/SetupController.h"
#include "platform/views/View.h"

#include <utility>

namespace nimbra {

ViewController::ViewController(const PlatformServices& services) : _services(services) {}

ViewController::~ViewController() = default;

void ViewController::loadViewIfNeeded() {
    if (!_view) {
        loadView();
        viewDidLoad();
    }
}

void ViewController::layoutViewIfNeeded() {
    if (!_view) {
        return;
    }
    if (_view->needsLayout()) {
        viewWillLayoutSubviews();
    }
    _view->layoutIfNeeded();
}

void ViewController::loadView() {
    _view = std::make_shared<View>(_services, Rect());
}

void ViewController::viewDidLoad() {}

void ViewController::viewDidAppear(bool /*animated*/) {}

void ViewController::viewDidDisappear(bool /*animated*/) {}

void ViewController::viewWillLayoutSubviews() {}

bool ViewController::isPresentedAsModalSheet() const {
    const auto holder = std::dynamic_pointer_cast<SetupController>(parentController());
    return holder && holder->isSheet();
}

void ViewController::setView(std::shared_ptr<View> view) {
    _view = std::move(view);
}

void ViewController::setTitle(Text title) {
    _title = std::move(title);
}

void ViewController::presentViewControllerAnimated(
    const std::shared_ptr<SetupController>& controller, bool animated) const {
    _services.presenter->presentController(controller, animated);
}

void ViewController::presentViewControllerAnimated(const std::shared_ptr<AlertController>& alert,
                                                   bool animated) const {
    _services.presenter->presentAlert(alert, animated);
}

void ViewController::presentViewControllerAnimated(const std::shared_ptr<ShareSheet>& sheet,
                                                   bool animated) const {
    _services.presenter->presentShareSheet(sheet, animated);
}

void ViewController::dismissViewControllerAnimated(bool animated) const {
    _services.presenter->dismissPresentedController(animated);
}

void ViewController::dismissAnimated(bool animated) const {
    _services.presenter->dismissController(*this, animated);
}

} // namespace nimbra
