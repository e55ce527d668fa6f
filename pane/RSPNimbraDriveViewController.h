#pragma once

#include "pane/RSPServiceAccessCache.h"
#include "platform/host/AccountSettingsPane.h"
#include "platform/system/NotificationCenter.h"
#include "platform/values/FileURL.h"
#include "platform/values/RowValue.h"
#include "upgrade/RSPUpgradeViewControllerDelegate.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace nimbra {

class Account;
class DataOrEventSource;
class RefreshControl;
class WorkQueue;

/// The cloud-documents page of one account.
///
/// The row that opens it carries the account in its user info: under `FirstSetupKey` whether this
/// is the account's first setup, and then under `AccountKey` the account itself, otherwise under
/// `AccountIdentifierKey` its identifier.
///
/// Main queue only, except where an operation says otherwise.
class RSPNimbraDriveViewController : public AccountSettingsPane,
                                     public RSPUpgradeViewControllerDelegate {
public:
    using AccountSettingsPane::AccountSettingsPane;

    const SpecifierArray& specifiers() override;

    void viewDidLoad() override;
    void viewDidAppear(bool animated) override;
    void viewDidDisappear(bool animated) override;

    void operationsHelperWillSaveAccount(AccountOperationsHelper& helper,
                                         const std::shared_ptr<Account>& account) override;
    void operationsHelperDidSaveAccountWithSuccessError(
        AccountOperationsHelper& helper, const std::shared_ptr<Account>& account,
        const std::expected<void, Error>& saved) override;

    void upgradeViewControllerDidCancel(
        const std::shared_ptr<RSPUpgradeViewController>& screen) override;
    void upgradeViewControllerDidSucceed(
        const std::shared_ptr<RSPUpgradeViewController>& screen) override;

protected:
    // Where the rows come from that stand around the master switch.

    /// The row that starts the move to the new document service.
    [[nodiscard]] virtual std::shared_ptr<Specifier> _createSpecifierForUpgradeButton();
    /// One row an application, unsorted; empty for none.
    [[nodiscard]] virtual SpecifierArray _appSpecifiersForPRVServices();
    /// The group and the switch of cellular data; nothing on a device without it.
    [[nodiscard]] std::optional<SpecifierArray> _createSpecifiersForCellularSwitchCell();
    /// The link to the settings of the cloud database; null for an account without it.
    [[nodiscard]] virtual std::shared_ptr<Specifier> _specifierForTessary();
    /// The group and the button of diagnostics; nothing while diagnostics are off.
    [[nodiscard]] virtual std::optional<SpecifierArray> _createSpecifiersForDiagnostics();

    /// `name` as a part of a file's name. Any queue.
    [[nodiscard]] static std::string _sanitizeForDiagnoseName(std::string name);
    /// Empties the directory of the archive, and says where in it the archive of this moment is to
    /// stand; nothing, and a line in the log, where that fails. Any queue but the main one.
    [[nodiscard]] std::optional<std::string> _diagnosePathForMR() const;
    /// Has an archive written, and waits for it; nothing where none was. Any queue but the main
    /// one.
    [[nodiscard]] std::optional<FileURL> _collectMRLogs() const;
    /// What a tap on the button `row` calls: an archive is collected in the background and offered
    /// to be shared. Nothing while the page is at it already.
    void diagnoseDocumentsAndData(const std::shared_ptr<Specifier>& row);

    /// The row of one application; null for one that is not installed or not to be shown.
    [[nodiscard]] std::shared_ptr<Specifier>
    _appSpecifierWithBundleID(const BundleIdentifier& bundleID);
    void _setAppAccessGrantedForBundleID(const RowValue& value, const BundleIdentifier& bundleID);
    /// Whether the application may use the cloud; always a boolean.
    [[nodiscard]] RowValue _appAccessGrantedForBundleID(const BundleIdentifier& bundleID);

    /// Shows the rows that depend on the master switch, or hides them, as one animated batch.
    void _reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();

    /// The account that the page shows and edits, read on the first call; null when the store has
    /// none for the entry row.
    [[nodiscard]] std::shared_ptr<Account> _vantrelAccount();
    /// Reads the account anew; changes that were not saved are lost. Any queue: a failed save reads
    /// it on the queue that reports the failure.
    void _reloadVantrelAccount();

    /// Asks for a run of the priority registration; requests that come before it starts share it.
    /// Any queue, from the first `viewDidAppear` on; before that the main queue.
    void _registerContainerPriorityHinting();

private:
    /// The bundle that the page's texts stand in, asked for by its name; null while it is not
    /// found.
    [[nodiscard]] std::shared_ptr<Bundle> _paneBundle() const;
    [[nodiscard]] Text _localizedString(const Text& key) const;
    [[nodiscard]] std::shared_ptr<Specifier> _masterSwitch();
    [[nodiscard]] SpecifierArray _sortedAppSpecifiers(SpecifierArray rows) const;
    [[nodiscard]] SpecifierArray _arrangedSpecifiers();
    [[nodiscard]] bool _isTidewaterEnabled();
    [[nodiscard]] RowValue _documentsAndDataEnabled(const Specifier* row);
    void _setDocumentsAndDataEnabledForSpecifier(const RowValue& value,
                                                 const std::shared_ptr<Specifier>& row);
    void _setDocumentsAndDataEnabled(bool enabled);

    [[nodiscard]] RowValue _appAccessGrantedForSpecifier(const Specifier& row);
    void _setAppAccessGrantedForSpecifier(const RowValue& value,
                                          const std::shared_ptr<Specifier>& row);

    [[nodiscard]] RowValue _useCellular(const Specifier& row);
    void _setUseCellularForSpecifier(const RowValue& value, const std::shared_ptr<Specifier>& row);

    void _loadTessarySettingsBundleIfNeeded();
    [[nodiscard]] std::optional<std::int64_t> _numberOfAppsUsingTessary();
    [[nodiscard]] RowValue _valueForTessarySpecifier(const Specifier& row);

    void _upgradeButtonWasTapped(const std::shared_ptr<Specifier>& row);

    void _diagnosisDidEnd(const std::optional<FileURL>& archive,
                          const std::shared_ptr<Specifier>& row);
    void _showFailedDiagnosisAlert() const;
    void _shareDiagnosis(const FileURL& archive, const std::shared_ptr<Specifier>& row);
    void _diagnosisTaskFinished();

    void _refresh(const std::shared_ptr<RefreshControl>& sender);
    [[nodiscard]] std::shared_ptr<ObserverToken>
    _observe(const NotificationName& name, void (RSPNimbraDriveViewController::*handle)());
    void _unregisterContainerPriorityHinting();

    std::shared_ptr<Specifier> _NimbraDriveSpecifier; // NOLINT(bugprone-reserved-identifier)
    std::shared_ptr<Specifier> _statusInfoSpecifier;
    SpecifierArray _appSpecifiers;
    std::optional<SpecifierArray> _cellularSpecifiers;
    std::optional<SpecifierArray> _logsSpecifiers;

protected:
    /// What the rows of the applications show and change, read when they were built last.
    std::optional<RSPServiceAccessCache> _accessCache;

private:
    std::shared_ptr<Account> _vantrelAccount_;
    std::atomic<bool> _isFirstSetup = false;
    std::shared_ptr<ObserverToken> _uiApplicationDidBecomeActiveObserver;
    /// Never set: the status footer watches the sync status itself.
    std::shared_ptr<ObserverToken> _mrDidUpdateLastSyncStatusObserver;
    std::shared_ptr<ObserverToken> _mrTidewaterIdentityTokenStatusObserver;
    std::shared_ptr<ObserverToken> _mrContainersListChangedNotification;
    std::shared_ptr<DataOrEventSource> _containerPriorityHintingSource;
    std::shared_ptr<WorkQueue> _containerPriorityHintingQueue;
    std::once_flag _containerPriorityHintingCreation;
    /// A failed save replaces the account while the main queue may read it.
    std::mutex _vantrelAccountMutex;
};

} // namespace nimbra
