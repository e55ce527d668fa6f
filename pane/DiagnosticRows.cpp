// The rows of diagnostics: the button has the archive collected and offers it to be shared.
#include "pane/RSPNimbraDriveViewController.h"
#include "platform/host/AlertController.h"
#include "platform/host/SettingsRootController.h"
#include "platform/host/ShareSheet.h"
#include "platform/system/FileManager.h"
#include "platform/system/Preferences.h"
#include "platform/system/WorkQueues.h"
#include "support/LogMessages.h"

namespace nimbra {

namespace {

/// The document service's level of logging at which its diagnostics are offered, and no other.
constexpr std::int64_t diagnosticsLogLevel = 7;

} // namespace

std::optional<SpecifierArray> RSPNimbraDriveViewController::_createSpecifiersForDiagnostics() {
    const auto logLevel =
        services().preferences->appIntegerValueForKeyInDomain("log.level", "com.vantrel.marrow");
    if (logLevel != diagnosticsLogLevel) {
        return std::nullopt;
    }
    const auto group = Specifier::groupSpecifierWithID("RSPDiagnostics");
    group->setPropertyForKey(_localizedString("CLOUD_DRIVE_DIAGNOSE_TEXT"), FooterTextGroupKey);

    const auto row = Specifier::preferenceSpecifierNamed(_localizedString("CLOUD_DRIVE_DIAGNOSE"),
                                                         {.target = this, .cell = ButtonCell});
    row->setIdentifier("CLOUD_DRIVE_DIAGNOSE");
    row->setButtonAction(
        [this](const std::shared_ptr<Specifier>& tapped) { diagnoseDocumentsAndData(tapped); });
    return SpecifierArray{group, row};
}

void RSPNimbraDriveViewController::diagnoseDocumentsAndData(const std::shared_ptr<Specifier>& row) {
    auto pane = std::static_pointer_cast<RSPNimbraDriveViewController>(shared_from_this());
    // Without the host's controller nobody knows of a collection under way: then each tap starts
    // one.
    if (const auto root = rootController()) {
        if (root->taskIsRunning(pane)) {
            return;
        }
        root->addTask(pane);
    }
    showActivityInProgressUIWithMessage(_localizedString("CLOUD_DRIVE_DIAGNOSE_GATHER"));
    // The holds go on to the main queue with the result: nothing stays behind that could let the
    // page or its row go on the other one.
    services()
        .workQueues->globalQueueWithQuality(UserInitiatedQuality)
        .async([pane = std::move(pane), heldRow = row]() mutable {
            WorkQueue& mainQueue = pane->services().workQueues->mainQueue();
            std::optional<FileURL> archive = pane->_collectMRLogs();
            mainQueue.async(
                [pane = std::move(pane), archive = std::move(archive),
                 heldRow = std::move(heldRow)] { pane->_diagnosisDidEnd(archive, heldRow); });
        });
}

void RSPNimbraDriveViewController::_diagnosisDidEnd(const std::optional<FileURL>& archive,
                                                    const std::shared_ptr<Specifier>& row) {
    hideActivityInProgressUI();
    // The tool may say that all is well and have written nothing.
    if (archive && services().fileManager->isResourceReachable(*archive)) {
        _shareDiagnosis(*archive, row);
        return;
    }
    _showFailedDiagnosisAlert();
    _diagnosisTaskFinished();
}

/// Why there is no archive is not told: the user could do nothing about it.
void RSPNimbraDriveViewController::_showFailedDiagnosisAlert() const {
    // Looked up from top to bottom: missing texts are told in this order.
    const Text title = _localizedString("CLOUD_DRIVE_DIAGNOSE_ERROR");
    const Text message = _localizedString("CLOUD_DRIVE_DIAGNOSE_ERROR_TEXT");
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        title, message, AlertControllerStyle::alert);
    alert->addAction(AlertAction::actionWithTitleStyleHandler(
        _localizedString("CLOUD_DRIVE_DIAGNOSE_ERROR_OK"), AlertActionStyle::standard, {}));
    presentViewControllerAnimated(alert, true);
}

void RSPNimbraDriveViewController::_shareDiagnosis(const FileURL& archive,
                                                   const std::shared_ptr<Specifier>& row) {
    const auto sheet = std::make_shared<ShareSheet>(std::vector{archive});
    sheet->setIncludedActivityTypes(
        {ActivityTypeMessage, ActivityTypeMail, ActivityTypeNearbyTransfer});
    const auto pane = std::static_pointer_cast<RSPNimbraDriveViewController>(shared_from_this());
    // Whatever came of it: the archive stays, and the page is free again.
    sheet->setCompletionWithItemsHandler([pane](ShareOutcome /*outcome*/) {
        pane->_diagnosisTaskFinished();
        pane->dismissViewControllerAnimated(true);
    });

    const std::optional<IndexPath> place = indexPathForSpecifier(row);
    const auto cell = place ? table()->cellForRowAtIndexPath(*place) : nullptr;
    writeLogMessage(services().systemLog, log_messages::settingShareSourceView,
                    cell ? cell->description() : "(null)");
    sheet->popoverPresentationController().sourceView = cell;
    presentViewControllerAnimated(sheet, true);
}

void RSPNimbraDriveViewController::_diagnosisTaskFinished() {
    if (const auto root = rootController()) {
        root->taskFinished(shared_from_this());
    }
}

} // namespace nimbra
