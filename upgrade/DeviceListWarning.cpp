// What the screen warns of: the devices of the account that cannot follow it to the new document
// service, or not yet.
#include "platform/accounts/DeviceListRequests.h"
#include "platform/system/WorkQueues.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Button.h"
#include "platform/views/Label.h"
#include "platform/views/ViewAnimations.h"
#include "platform/views/ViewMetrics.h"
#include "support/RSPLocalizedFormat.h"
#include "upgrade/RSPUpgradeViewController.h"

#include <chrono>
#include <cstddef>
#include <utility>

namespace nimbra {

namespace {

std::size_t countOf(const std::optional<std::vector<Text>>& devices) {
    return devices ? devices->size() : 0;
}

Text joinedByLine(const std::vector<Text>& names) {
    std::string lines;
    for (const Text& name : names) {
        lines += (&name == &names.front() ? "" : "\n") + name.string();
    }
    return lines;
}

} // namespace

void RSPUpgradeViewController::_createTextAttributes() {
    ParagraphStyle regularStyle;
    regularStyle.alignment = TextAlignment::center;
    const ParagraphStyle compactStyle = regularStyle;
    regularStyle.paragraphSpacing = 8.0;
    // Below zero, and meant: the lines of a paragraph stand closer than the font has them.
    regularStyle.lineSpacing = -2.0;

    const Font bodyFont = services().viewMetrics->preferredFontForTextStyle(FontTextStyleBody);
    const Font boldFont = Font::boldSystemFontOfSize(bodyFont.pointSize);

    _plainTextAttributes = {.FontAttributeName = bodyFont,
                            .ParagraphStyleAttributeName = regularStyle};
    _boldTextAttributes = {.FontAttributeName = boldFont,
                           .ParagraphStyleAttributeName = regularStyle};
    _compactBoldTextAttributes = {.FontAttributeName = boldFont,
                                  .ParagraphStyleAttributeName = compactStyle};
}

// Asked once a screen. While no answer comes the button stays hidden and disabled: nobody upgrades
// without having seen the warning.
void RSPUpgradeViewController::_loadListOfDevicesImpactedByMigration() {
    _spinner->startAnimating();
    const auto request = services().deviceListRequests->initWithAccount(_account());
    request->performRequestWithHandler(
        [screen = sharedFromThis()](const DeviceListRequest& /*request*/,
                                    const std::optional<DeviceListResponse>& response) mutable {
            // No answer is no devices: the user may upgrade all the same.
            const DeviceListResponse answer = response.value_or(DeviceListResponse());
            screen->_devicesThatCannotUpgrade = answer.incompatibleDeviceNames;
            screen->_devicesThatNeedUpgrade = answer.needUpgradeDeviceNames;
            // The hold goes along, so that the screen is let go on the main queue.
            WorkQueue& mainQueue = screen->services().workQueues->mainQueue();
            mainQueue.async([screen = std::move(screen)] { screen->_showWarning(); });
        });
}

void RSPUpgradeViewController::_showWarning() {
    _spinner->stopAnimating();
    _warningLabel->setAttributedText(_upgradeWarningText());
    view()->setNeedsLayout();
    // Behind the layout that this asks for.
    services().workQueues->mainQueue().async([screen = sharedFromThis()] { screen->_fadeIn(); });
}

void RSPUpgradeViewController::_fadeIn() {
    ViewAnimations& animations = services().viewAnimations;
    animations.beginAnimations("FadeIn");
    animations.setAnimationDuration(std::chrono::duration<double>(0.5));
    _warningLabel->setAlpha(1.0);
    _upgradeButton->setAlpha(1.0);
    animations.commitAnimations();
    // It can be tapped while it still fades in.
    _upgradeButton->setEnabled(true);
}

AttributedString RSPUpgradeViewController::_upgradeWarningText() const {
    if (countOf(_devicesThatCannotUpgrade) > 0 && countOf(_devicesThatNeedUpgrade) == 0) {
        return _warningForAllDevicesBeingIneligibleForUpgrade();
    }
    return _warningForSomeDevicesBeingEligibleForUpgrade();
}

// The pieces stand right behind each other: where a line ends, the texts say so.

MutableAttributedString
RSPUpgradeViewController::_warningForAllDevicesBeingIneligibleForUpgrade() const {
    MutableAttributedString warning;
    warning.appendAttributedString(_plain("CLOUD_DRIVE_UPGRADE_SHORT_DESCRIPTION"));
    warning.appendAttributedString(
        {_localizedString("CLOUD_DRIVE_UPGRADE_NOTE_HEADER"), _boldTextAttributes});
    warning.appendAttributedString(_plain("CLOUD_DRIVE_UPGRADE_OS_REQUIRED"));
    warning.appendAttributedString(
        _plain(countOf(_devicesThatCannotUpgrade) == 1
                   ? "CLOUD_DRIVE_UPGRADE_WARNING_ONE_INELIGIBLE_DEVICE"
                   : "CLOUD_DRIVE_UPGRADE_WARNING_MANY_INELIGIBLE_DEVICES"));
    warning.appendAttributedString({joinedByLine(_devicesThatCannotUpgrade.value_or(DeviceNames())),
                                    _compactBoldTextAttributes});
    return warning;
}

MutableAttributedString
RSPUpgradeViewController::_warningForSomeDevicesBeingEligibleForUpgrade() const {
    MutableAttributedString warning;
    warning.appendAttributedString(
        {_localizedString("CLOUD_DRIVE_UPGRADE_NOTE_HEADER"), _boldTextAttributes});
    const std::size_t needUpgrade = countOf(_devicesThatNeedUpgrade);
    const char* sentence = "CLOUD_DRIVE_UPGRADE_WARNING_NO_KNOWN_DEVICES";
    if (needUpgrade == 1) {
        sentence = "CLOUD_DRIVE_UPGRADE_WARNING_ONE_OTHER_DEVICE";
    } else if (needUpgrade >= 2) {
        sentence = "CLOUD_DRIVE_UPGRADE_WARNING_MULTIPLE_OTHER_DEVICES";
    }
    warning.appendAttributedString(_plain(sentence));
    if (const auto names = _commaSeparatedStringWithBoldNamesForDevices(_devicesThatNeedUpgrade)) {
        warning.appendAttributedString(*names);
    }
    // Behind the sentence of no known devices as well. The tables know the key by this spelling.
    warning.appendAttributedString(_plain("CLOUD_DRIVE_DEVICE_LIST_END_PUNCUATION"));
    warning.appendAttributedString({"\n", _plainTextAttributes});
    if (const auto names =
            _commaSeparatedStringWithBoldNamesForDevices(_devicesThatCannotUpgrade)) {
        warning.appendAttributedString(*names);
        // No end punctuation behind these: they bring their own.
        warning.appendAttributedString(
            _plain(countOf(_devicesThatCannotUpgrade) == 1
                       ? "CLOUD_DRIVE_UPGRADE_WARNING_ONE_INELIGIBLE_DEVICE_INLINE"
                       : "CLOUD_DRIVE_UPGRADE_WARNING_MANY_INELIGIBLE_DEVICES_INLINE"));
    }
    return warning;
}

std::optional<MutableAttributedString>
RSPUpgradeViewController::_commaSeparatedStringWithBoldNamesForDevices(
    const std::optional<DeviceNames>& devices) const {
    if (countOf(devices) == 0) {
        return std::nullopt;
    }
    const Text first =
        RSPLocalizedFormat("CLOUD_DRIVE_DEVICE_LIST_FIRST_ITEM", "Localizable", _paneBundle(),
                           services().localization, {devices->front()});
    MutableAttributedString list(first, _boldTextAttributes);
    if (devices->size() == 2) {
        // The tables know the key by this spelling.
        list.appendAttributedString(_plain("CLOUD_DRIVE_DEVICE_LIST_TWO_ITEM_SEPARAOTR"));
        list.appendAttributedString({devices->back(), _boldTextAttributes});
    } else if (devices->size() >= 3) {
        const MutableAttributedString separator = _plain("CLOUD_DRIVE_DEVICE_LIST_SEPARATOR");
        const MutableAttributedString lastSeparator =
            _plain("CLOUD_DRIVE_DEVICE_LIST_LAST_SEPARATOR");
        for (std::size_t index = 1; index < devices->size(); ++index) {
            const bool isLast = index + 1 == devices->size();
            list.appendAttributedString(isLast ? lastSeparator : separator);
            list.appendAttributedString({(*devices)[index], _boldTextAttributes});
        }
    }
    return list;
}

MutableAttributedString RSPUpgradeViewController::_plain(const Text& key) const {
    return {_localizedString(key), _plainTextAttributes};
}

} // namespace nimbra
