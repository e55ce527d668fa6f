#include "host/core/DetailPage.h"

#include "platform/system/ClassRegistry.h"

#include <utility>

namespace nimbra::host {

void DetailPage::open(const std::shared_ptr<Specifier>& row, const PlatformServices& services,
                      const std::shared_ptr<SettingsListController>& parent) {
    leave();
    const ControllerClass* pageClass = row->detailControllerClass();
    // The class may be anybody's: it has been found by its name alone.
    _page = pageClass != nullptr && pageClass->create ? pageClass->create(services) : nullptr;
    if (!_page) {
        return;
    }
    _page->setSpecifier(row);
    _page->setParentController(parent);
    _page->loadViewIfNeeded();
    _page->viewDidAppear(true);
}

void DetailPage::leave() {
    if (const auto left = std::exchange(_page, nullptr)) {
        left->viewDidDisappear(true);
    }
}

std::string DetailPage::title() const {
    return (_page->title() ? _page->title() : _page->specifier()->name()).string();
}

} // namespace nimbra::host
