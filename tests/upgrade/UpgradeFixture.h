#pragma once

#include "platform/host/SetupController.h"
#include "platform/views/Button.h"
#include "platform/views/Image.h"
#include "platform/views/View.h"
#include "tests/support/SyslogCapture.h"
#include "tests/support/TestPlatform.h"
#include "upgrade/RSPUpgradeViewController.h"
#include "upgrade/RSPUpgradeViewControllerDelegate.h"

#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace nimbra::test {

/// The screen with what it keeps to itself.
class OpenScreen final : public RSPUpgradeViewController {
public:
    using RSPUpgradeViewController::_commaSeparatedStringWithBoldNamesForDevices;
    using RSPUpgradeViewController::_devicesThatCannotUpgrade;
    using RSPUpgradeViewController::_devicesThatNeedUpgrade;
    using RSPUpgradeViewController::_heightForAttributedTextInLabel;
    using RSPUpgradeViewController::_heightForTextWithFontConstrainedToWidth;
    using RSPUpgradeViewController::_upgradeWarningText;
    using RSPUpgradeViewController::RSPUpgradeViewController;

    /// The view under this name; null where there is none.
    template <class Kind>
    [[nodiscard]] std::shared_ptr<Kind> viewNamed(const char* name) const {
        return std::dynamic_pointer_cast<Kind>(find(view(), name));
    }

private:
    static std::shared_ptr<View> find(const std::shared_ptr<View>& view, const std::string& name) {
        if (view->accessibilityIdentifier() == name) {
            return view;
        }
        for (const auto& subview : view->subviews()) {
            if (auto found = find(subview, name)) {
                return found;
            }
        }
        return nullptr;
    }
};

/// Notes how screens have ended.
class RecordingDelegate final : public RSPUpgradeViewControllerDelegate {
public:
    void upgradeViewControllerDidCancel(
        const std::shared_ptr<RSPUpgradeViewController>& screen) override {
        ended.push_back({"cancel", screen});
    }
    void upgradeViewControllerDidSucceed(
        const std::shared_ptr<RSPUpgradeViewController>& screen) override {
        ended.push_back({"success", screen});
    }

    struct End {
        std::string how;
        std::weak_ptr<RSPUpgradeViewController> screen;
    };
    std::vector<End> ended;
};

/// A page from which the screen was opened.
class ParentPage final : public Controller {
public:
    explicit ParentPage(std::vector<std::string>& calls) : _calls(calls) {}
    void reloadSpecifiers() override { _calls.emplace_back("reload parent's rows"); }

private:
    std::vector<std::string>& _calls;
};

/// The screen of the account "primary", which uses the older storage, in a form sheet. Each text is
/// its place in the warning between brackets.
struct UpgradeFixture : testing::Test {
    TestPlatform platform;
    SyslogCapture syslog;
    std::shared_ptr<FakeAccount> account = std::make_shared<FakeAccount>("primary");
    std::shared_ptr<Specifier> entry =
        Specifier::preferenceSpecifierNamed("Nimbra Drive", {.cell = LinkListCell});
    std::shared_ptr<RecordingDelegate> delegate = std::make_shared<RecordingDelegate>();
    std::shared_ptr<ParentPage> parent = std::make_shared<ParentPage>(platform.calls);
    std::shared_ptr<OpenScreen> screen = std::make_shared<OpenScreen>(platform.services());
    std::shared_ptr<SetupController> sheet = std::make_shared<SetupController>(screen);

    UpgradeFixture() {
        platform.bundles.paneBundle = std::make_shared<FakeBundle>(texts());
        platform.bundles.paneBundle->images["NimbraDrive"] =
            std::make_shared<Image>(Image{.name = "NimbraDrive", .size = {96, 64}});
        platform.bundles.bundleOfClasses = platform.bundles.paneBundle;
        account->flags.usesStratafile = false;
        entry->setUserInfo({{AccountKey, std::shared_ptr<Account>(account)}});
        screen->setSpecifier(entry);
        screen->setDelegate(delegate);
        screen->setParentController(sheet);
        sheet->setParentController(parent);
        sheet->setModalPresentationStyle(ModalPresentationStyle::formSheet);
    }

    [[nodiscard]] static std::map<std::string, Text> texts() {
        return {{"CLOUD_DRIVE", "[page]"},
                {"CLOUD_DRIVE_UPGRADE_TITLE", "[title]"},
                {"CLOUD_DRIVE_UPGRADE_BUTTON", "[button]"},
                {"CLOUD_DRIVE_UPGRADE_SHORT_DESCRIPTION", "[short]"},
                {"CLOUD_DRIVE_UPGRADE_NOTE_HEADER", "[header]"},
                {"CLOUD_DRIVE_UPGRADE_OS_REQUIRED", "[required]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_ONE_INELIGIBLE_DEVICE", "[one cannot]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_MANY_INELIGIBLE_DEVICES", "[many cannot]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_ONE_OTHER_DEVICE", "[one other]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_MULTIPLE_OTHER_DEVICES", "[multiple others]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_NO_KNOWN_DEVICES", "[none known]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_ONE_INELIGIBLE_DEVICE_INLINE", "[it cannot]"},
                {"CLOUD_DRIVE_UPGRADE_WARNING_MANY_INELIGIBLE_DEVICES_INLINE", "[they cannot]"},
                {"CLOUD_DRIVE_DEVICE_LIST_FIRST_ITEM", "first({0})"},
                {"CLOUD_DRIVE_DEVICE_LIST_TWO_ITEM_SEPARAOTR", " and "},
                {"CLOUD_DRIVE_DEVICE_LIST_SEPARATOR", ", "},
                {"CLOUD_DRIVE_DEVICE_LIST_LAST_SEPARATOR", ", and "},
                {"CLOUD_DRIVE_DEVICE_LIST_END_PUNCUATION", "[end]"},
                {"CLOUD_DRIVE_ALERT_TITLE", "Sure?"},
                {"CLOUD_DRIVE_ALERT_MESSAGE", "No way back."},
                {"CANCEL", "Cancel"},
                {"CONTINUE", "Continue"},
                {"UPGRADING_TO_CLOUD_DRIVE", "Upgrading"},
                {"FAILED_MIGRATION_CLOUD_DRIVE", "Failed"},
                {"FAILED_MIGRATION_CLOUD_DRIVE_DESCRIPTION", "It did not work."},
                {"OK", "OK"}};
    }

    /// The keys that were looked up and not found, in order.
    [[nodiscard]] std::vector<std::string> missingKeys() const {
        std::vector<std::string> keys;
        for (const auto& [priority, line] : syslog.lines) {
            keys.push_back(line.substr(line.find(": ") + 2));
        }
        return keys;
    }

    /// Loads the view, which asks for the devices, and answers with these.
    void showDevices(std::optional<std::vector<Text>> needUpgrade,
                     std::optional<std::vector<Text>> cannotUpgrade) {
        screen->loadViewIfNeeded();
        platform.deviceListRequests.answer(
            DeviceListResponse{.incompatibleDeviceNames = std::move(cannotUpgrade),
                               .needUpgradeDeviceNames = std::move(needUpgrade)});
        platform.workQueues.mainQueue().pump();
    }
};

/// The text with what is bold between "*" and what is compact and bold between "#".
inline std::string marked(const AttributedString& text) {
    std::string result;
    for (const AttributedString::Run& run : text.runs()) {
        const bool isBold = run.attributes.FontAttributeName.weight == FontWeight::bold;
        const bool isCompact = run.attributes.ParagraphStyleAttributeName.paragraphSpacing == 0;
        const char* mark = !isBold ? "" : isCompact ? "#" : "*";
        result += mark + run.text + mark;
    }
    return result;
}

} // namespace nimbra::test
