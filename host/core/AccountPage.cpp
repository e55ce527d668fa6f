#include "host/core/AccountPage.h"

#include <utility>

namespace nimbra::host {

AccountPage::AccountPage(const PlatformServices& services, Text title,
                         const ControllerClass& paneClass, UserInfo userInfo)
    : SettingsListController(services),
      _entryRow(Specifier::preferenceSpecifierNamed(
          std::move(title), {.target = this, .detail = &paneClass, .cell = LinkListCell})) {
    _entryRow->setUserInfo(std::move(userInfo));
}

const SpecifierArray& AccountPage::specifiers() {
    if (!_specifiers) {
        _specifiers = {Specifier::groupSpecifierWithID("Services"), _entryRow};
    }
    return *_specifiers;
}

} // namespace nimbra::host
