#include "samples/tessary/TSYSettingsController.h"

#include "platform/accounts/Account.h"
#include "samples/tessary/AppGroups.h"

#include <algorithm>

namespace nimbra::samples {

TSYSettingsController::TSYSettingsController(const PlatformServices& services)
    : SettingsListController(services) {
    setTitle("Look Me Up");
}

const SpecifierArray& TSYSettingsController::specifiers() {
    if (!_specifiers) {
        // The file may say any number, and nobody reads that many rows.
        constexpr std::int64_t mostRows = 20;
        const std::int64_t rows =
            std::clamp<std::int64_t>(numberOfAppGroups().value_or(0), 0, mostRows);
        _mayLookUp.resize(static_cast<std::size_t>(rows), true);
        _specifiers = {groupOfAccount()};
        for (std::size_t index = 0; index < _mayLookUp.size(); ++index) {
            _specifiers->push_back(switchOfGroup(index));
        }
    }
    return *_specifiers;
}

std::shared_ptr<Specifier> TSYSettingsController::groupOfAccount() const {
    const auto account =
        specifier() ? userInfoValue<std::shared_ptr<Account>>(specifier()->userInfo(), AccountKey)
                    : nullptr;
    const auto group = Specifier::groupSpecifierWithID("TSYAppGroups");
    group->setPropertyForKey(
        account ? Text("Who uses one of these groups of apps can find the account " +
                       account->identifier().string() + " by its email address.")
                : Text("There is no account to be found."),
        FooterTextGroupKey);
    return group;
}

std::shared_ptr<Specifier> TSYSettingsController::switchOfGroup(std::size_t index) {
    const std::string number = std::to_string(index + 1);
    auto row = Specifier::preferenceSpecifierNamed(
        Text("App Group " + number),
        {.target = this,
         .set = [this, index](const RowValue& value,
                              const auto& /*row*/) { _mayLookUp[index] = boolValue(value); },
         .get = [this, index](const Specifier&) { return RowValue(bool{_mayLookUp[index]}); },
         .cell = SwitchCell});
    row->setIdentifier(Text("app-group-" + number));
    return row;
}

} // namespace nimbra::samples
