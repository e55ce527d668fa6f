#pragma once

#include "platform/host/AccountSettingsPane.h"
#include "platform/views/AttributedString.h"

#include <expected>
#include <memory>
#include <optional>
#include <vector>

namespace nimbra {

class Account;
class ActivityIndicatorView;
class Bundle;
class Button;
class ImageView;
class Label;
class RSPUpgradeViewControllerDelegate;
class ScrollView;

/// The screen that moves an account from the older document storage to the new document service,
/// after a warning that names the account's devices that cannot follow. It is a list page without
/// rows: what it shows are views of its own.
///
/// The row that it is opened from carries the account in its user info, under `AccountKey`. Main
/// queue only, but for its release.
class RSPUpgradeViewController : public AccountSettingsPane {
public:
    /// The services outlive the screen.
    explicit RSPUpgradeViewController(const PlatformServices& services);
    ~RSPUpgradeViewController() override;

    /// Who is told how the screen ends, held weakly; null when there is nobody.
    [[nodiscard]] std::shared_ptr<RSPUpgradeViewControllerDelegate> delegate() const;
    void setDelegate(std::weak_ptr<RSPUpgradeViewControllerDelegate> delegate);

    /// No rows.
    [[nodiscard]] const SpecifierArray& specifiers() override;

    void loadView() override;
    void viewDidLoad() override;
    void viewWillLayoutSubviews() override;
    void cancelButtonTapped(const BarButtonItem& sender) override;

protected:
    /// Names of devices as their users gave them, to be shown as they stand and in this order.
    using DeviceNames = std::vector<Text>;

    // What the warning says.

    /// Of the devices that are known now.
    [[nodiscard]] AttributedString _upgradeWarningText() const;
    [[nodiscard]] MutableAttributedString _warningForAllDevicesBeingIneligibleForUpgrade() const;
    [[nodiscard]] MutableAttributedString _warningForSomeDevicesBeingEligibleForUpgrade() const;
    /// The names as a list in a sentence; nothing for no names.
    [[nodiscard]] std::optional<MutableAttributedString>
    _commaSeparatedStringWithBoldNamesForDevices(const std::optional<DeviceNames>& devices) const;

    // How high texts are, in whole points.

    [[nodiscard]] double _heightForTextWithFontConstrainedToWidth(const Text& text,
                                                                  const Font& font,
                                                                  double width) const;
    /// At the width that the label has now.
    [[nodiscard]] double _heightForAttributedTextInLabel(const Label& label) const;

private:
    void _createTextAttributes();
    void _loadListOfDevicesImpactedByMigration();
    void _showWarning();
    void _fadeIn();
    [[nodiscard]] MutableAttributedString _plain(const Text& key) const;

    /// The margin of the pad, or of every other device.
    [[nodiscard]] double _margin(double onPad, double elsewhere) const;

    void _upgradeButtonWasTapped(const std::shared_ptr<Button>& sender);
    void _upgrade();
    /// On the queue of the store.
    void _handleSaveCompletionForAccountSuccessError(const std::shared_ptr<Account>& account,
                                                     const std::expected<void, Error>& saved);
    void _showFailedUpgradeAlert();
    void _dismiss();

    [[nodiscard]] std::shared_ptr<Account> _account() const;

    // Two ways to the bundle, and both are meant. What stands on the screen from the start, its
    // titles and its picture, is of the bundle that the screen's own class came with. Warnings and
    // alerts ask for the bundle of the page by its name, which may not be found.

    [[nodiscard]] std::shared_ptr<Bundle> _ownBundle() const;
    [[nodiscard]] Text _ownLocalizedString(const Text& key) const;
    [[nodiscard]] std::shared_ptr<Bundle> _paneBundle() const;
    [[nodiscard]] Text _localizedString(const Text& key) const;

    [[nodiscard]] std::shared_ptr<RSPUpgradeViewController> sharedFromThis();

    std::shared_ptr<ScrollView> _scrollView;
    std::shared_ptr<View> _contentView;
    std::shared_ptr<ImageView> _cloudDriveLogo;
    std::shared_ptr<Label> _titleLabel;
    std::shared_ptr<Label> _warningLabel;
    std::shared_ptr<Button> _upgradeButton;
    std::shared_ptr<ActivityIndicatorView> _spinner;

protected:
    /// Written on the thread that answers the request, before the main queue is told to read them;
    /// read on the main queue only. Absent until then, and where there was no answer.
    std::optional<DeviceNames> _devicesThatNeedUpgrade;
    std::optional<DeviceNames> _devicesThatCannotUpgrade;

private:
    TextAttributes _plainTextAttributes;
    TextAttributes _boldTextAttributes;
    TextAttributes _compactBoldTextAttributes;
    std::weak_ptr<RSPUpgradeViewControllerDelegate> _delegate;
};

} // namespace nimbra
