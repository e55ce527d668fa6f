#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/Account.h"
#include "platform/system/Localization.h"

#include <algorithm>

namespace nimbra {

const SpecifierArray& RSPNimbraDriveViewController::specifiers() {
    if (!_specifiers) {
        _specifiers = _arrangedSpecifiers();
    }
    return *_specifiers;
}

SpecifierArray RSPNimbraDriveViewController::_arrangedSpecifiers() {
    const auto driveGroup = Specifier::groupSpecifierWithID("RSPNimbraDrive");
    driveGroup->setPropertyForKey(_localizedString("CLOUD_DRIVE_EXPLANATION"), FooterTextGroupKey);

    _NimbraDriveSpecifier = _masterSwitch();

    _statusInfoSpecifier = Specifier::groupSpecifierWithID("RSPStatusInfo");
    _statusInfoSpecifier->setPropertyForKey(Text("RSPNimbraDriveProgressFooterView"),
                                            FooterCellClassGroupKey);

    // The rows that depend on the switch are built whatever its state, so that a flip only moves
    // them and asks nobody again.
    _appSpecifiers = _sortedAppSpecifiers(_appSpecifiersForPRVServices());
    _cellularSpecifiers = _createSpecifiersForCellularSwitchCell();
    _logsSpecifiers = _createSpecifiersForDiagnostics();

    SpecifierArray rows;
    const auto append = [&rows](const SpecifierArray& more) {
        rows.insert(rows.end(), more.begin(), more.end());
    };

    const std::shared_ptr<Account> account = _vantrelAccount();
    if (!account || !account->vt_isUsingStratafile()) {
        if (const auto upgrade = _createSpecifierForUpgradeButton()) {
            rows.push_back(upgrade);
        }
    }
    rows.push_back(driveGroup);
    rows.push_back(_NimbraDriveSpecifier);
    const bool isOn = boolValue(_documentsAndDataEnabled(nullptr));
    if (isOn) {
        rows.push_back(_statusInfoSpecifier);
    }
    if (const auto tessary = _specifierForTessary()) {
        rows.push_back(Specifier::groupSpecifierWithID("RSPLookMeUpByEmail"));
        rows.push_back(tessary);
    }
    if (isOn) {
        append(_appSpecifiers);
        append(_cellularSpecifiers.value_or(SpecifierArray()));
        append(_logsSpecifiers.value_or(SpecifierArray()));
    }
    return rows;
}

std::shared_ptr<Specifier> RSPNimbraDriveViewController::_masterSwitch() {
    return Specifier::preferenceSpecifierNamed(
        _localizedString("CLOUD_DRIVE"),
        {.target = this,
         .set = [this](const RowValue& value,
                       const auto& row) { _setDocumentsAndDataEnabledForSpecifier(value, row); },
         .get = [this](const Specifier& row) { return _documentsAndDataEnabled(&row); },
         .cell = SwitchCell});
}

/// The applications' group and its rows by name; empty where there are no rows.
SpecifierArray RSPNimbraDriveViewController::_sortedAppSpecifiers(SpecifierArray rows) const {
    if (rows.empty()) {
        return {};
    }
    // The group has no name, and an absent name comes before every other: it stays at the head.
    rows.insert(rows.begin(), Specifier::groupSpecifierWithID("RSPUIApps"));
    const Localization& localization = services().localization;
    std::ranges::stable_sort(rows, [&localization](const auto& left, const auto& right) {
        return localization.localizedStandardCompare(left->name(), right->name()) < 0;
    });
    return rows;
}

void RSPNimbraDriveViewController::_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState() {
    const SpecifierArray none;
    if (_isTidewaterEnabled()) {
        if (indexOfSpecifier(_statusInfoSpecifier)) {
            return;
        }
        beginUpdates();
        insertSpecifierAfterSpecifierAnimated(_statusInfoSpecifier, _NimbraDriveSpecifier, true);
        addSpecifiersFromArrayAnimated(_appSpecifiers, true);
        addSpecifiersFromArrayAnimated(_cellularSpecifiers.value_or(none), true);
        addSpecifiersFromArrayAnimated(_logsSpecifiers.value_or(none), true);
        endUpdates();
    } else {
        // Once the list is built the status group is always there, so the removal also runs when
        // the rows are hidden already: it then finds nothing to remove.
        if (_appSpecifiers.empty() && !_cellularSpecifiers && !_logsSpecifiers &&
            !_statusInfoSpecifier) {
            return;
        }
        beginUpdates();
        removeContiguousSpecifiersAnimated(_logsSpecifiers.value_or(none), true);
        removeContiguousSpecifiersAnimated(_cellularSpecifiers.value_or(none), true);
        removeContiguousSpecifiersAnimated(_appSpecifiers, true);
        removeSpecifierAnimated(_statusInfoSpecifier, true);
        endUpdates();
    }
}

} // namespace nimbra
