#pragma once

#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/Account.h"
#include "tests/support/RecordingListObserver.h"
#include "tests/support/SyslogCapture.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace nimbra::test {

/// The pane with rows around the master switch, which a test lists.
class PaneWithRows final : public RSPNimbraDriveViewController {
public:
    using RSPNimbraDriveViewController::_accessCache;
    using RSPNimbraDriveViewController::_appAccessGrantedForBundleID;
    using RSPNimbraDriveViewController::_appSpecifierWithBundleID;
    using RSPNimbraDriveViewController::_collectMRLogs;
    using RSPNimbraDriveViewController::_createSpecifiersForCellularSwitchCell;
    using RSPNimbraDriveViewController::_diagnosePathForMR;
    using RSPNimbraDriveViewController::_registerContainerPriorityHinting;
    using RSPNimbraDriveViewController::_reloadSpecifiersThatDependOnDocumentsAndDataSwitchState;
    using RSPNimbraDriveViewController::_reloadVantrelAccount;
    using RSPNimbraDriveViewController::_sanitizeForDiagnoseName;
    using RSPNimbraDriveViewController::_setAppAccessGrantedForBundleID;
    using RSPNimbraDriveViewController::_vantrelAccount;
    using RSPNimbraDriveViewController::RSPNimbraDriveViewController;

    /// Flips the account object that the pane holds, as the master switch does.
    void turn(bool on) {
        _vantrelAccount()->setEnabledForDataclass(on, kAccountDataclassTidewater);
    }

    SpecifierArray _appSpecifiersForPRVServices() override {
        ++appQueries;
        asked.emplace_back("apps");
        return apps ? *apps : RSPNimbraDriveViewController::_appSpecifiersForPRVServices();
    }

    std::optional<SpecifierArray> _createSpecifiersForDiagnostics() override {
        asked.emplace_back("diagnostics");
        return diagnostics ? diagnostics
                           : RSPNimbraDriveViewController::_createSpecifiersForDiagnostics();
    }

    std::shared_ptr<Specifier> upgrade;
    /// Whether the upgrade row is the page's own instead.
    bool makesUpgradeRow = false;
    /// Absent: the rows that the page itself makes of the consent records.
    std::optional<SpecifierArray> apps = SpecifierArray();
    std::shared_ptr<Specifier> tessary;
    /// Whether the row of the cloud database is the page's own instead.
    bool makesTessaryRow = false;
    /// Absent: the rows that the page itself makes.
    std::optional<SpecifierArray> diagnostics;
    int appQueries = 0;
    /// The sources that were asked for rows, in order.
    std::vector<std::string> asked;

protected:
    std::shared_ptr<Specifier> _createSpecifierForUpgradeButton() override {
        asked.emplace_back("upgrade");
        return makesUpgradeRow ? RSPNimbraDriveViewController::_createSpecifierForUpgradeButton()
                               : upgrade;
    }
    std::shared_ptr<Specifier> _specifierForTessary() override {
        asked.emplace_back("tessary");
        return makesTessaryRow ? RSPNimbraDriveViewController::_specifierForTessary() : tessary;
    }
};

/// A pane on the account "primary", whose row travels with the account's identifier.
struct PaneFixture : testing::Test {
    TestPlatform platform;
    SyslogCapture syslog;
    std::shared_ptr<Specifier> entry =
        Specifier::preferenceSpecifierNamed("Nimbra Drive", {.cell = LinkListCell});
    std::shared_ptr<PaneWithRows> pane = std::make_shared<PaneWithRows>(platform.services());
    RecordingListObserver observer{platform.calls};

    PaneFixture() {
        entry->setUserInfo({{AccountIdentifierKey, Text("primary")}});
        pane->setSpecifier(entry);
        pane->setObserver(&observer);
    }

    void storeTidewater(bool enabled) {
        if (enabled) {
            platform.accountStore.stored.enabled.insert(kAccountDataclassTidewater);
        } else {
            platform.accountStore.stored.enabled.erase(kAccountDataclassTidewater);
        }
    }

    /// Every row source answers with rows: U, T, two apps, Cellular and D with their groups.
    void fillAllRows() {
        pane->upgrade = row("U");
        pane->tessary = row("T");
        pane->apps = {row("Zeta"), row("Alpha")};
        platform.deviceInfo.hasCellularData = true;
        pane->diagnostics =
            SpecifierArray{Specifier::groupSpecifierWithID("RSPDiagnostics"), row("D")};
    }

    [[nodiscard]] std::string rows() const { return labels(pane->specifiers()); }

    [[nodiscard]] static std::shared_ptr<Specifier> row(const char* name) {
        return Specifier::preferenceSpecifierNamed(name, {.cell = ButtonCell});
    }
};

using Calls = std::vector<std::string>;

} // namespace nimbra::test
