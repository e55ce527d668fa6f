// What the screen is made of, and where each view stands.
#include "platform/accounts/Account.h"
#include "platform/system/Bundles.h"
#include "platform/system/DeviceInfo.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Button.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ScrollView.h"
#include "platform/views/ViewMetrics.h"
#include "support/RSPLocalizedString.h"
#include "upgrade/RSPUpgradeViewController.h"
#include "upgrade/RSPUpgradeViewControllerDelegate.h"

#include <cmath>
#include <utility>

namespace nimbra {

RSPUpgradeViewController::RSPUpgradeViewController(const PlatformServices& services)
    : AccountSettingsPane(services) {
    _createTextAttributes();
}

RSPUpgradeViewController::~RSPUpgradeViewController() = default;

std::shared_ptr<RSPUpgradeViewControllerDelegate> RSPUpgradeViewController::delegate() const {
    return _delegate.lock();
}

void RSPUpgradeViewController::setDelegate(
    std::weak_ptr<RSPUpgradeViewControllerDelegate> delegate) {
    _delegate = std::move(delegate);
}

const SpecifierArray& RSPUpgradeViewController::specifiers() {
    if (!_specifiers) {
        _specifiers.emplace();
    }
    return *_specifiers;
}

void RSPUpgradeViewController::loadView() {
    AccountSettingsPane::loadView();
    const auto add = [](View& superview, const std::shared_ptr<View>& view, const char* name) {
        view->setAccessibilityIdentifier(name);
        superview.addSubview(view);
    };

    const std::optional<Screen> mainScreen = services().deviceInfo->mainScreen();
    _scrollView =
        std::make_shared<ScrollView>(services(), mainScreen ? mainScreen->bounds : Rect());
    _scrollView->setAccessibilityIdentifier("_scrollView");
    _scrollView->setBackgroundColor(Color::white);

    _contentView = std::make_shared<View>(services(), Rect());
    add(*_scrollView, _contentView, "_contentView");

    _titleLabel = std::make_shared<Label>(services(), Rect());
    _titleLabel->setText(_ownLocalizedString("CLOUD_DRIVE_UPGRADE_TITLE"));
    _titleLabel->setNumberOfLines(0);
    _titleLabel->setTextAlignment(TextAlignment::center);
    _titleLabel->setFont(Font::_lightSystemFontOfSize(32.0));
    add(*_contentView, _titleLabel, "_titleLabel");

    _warningLabel = std::make_shared<Label>(services(), Rect());
    _warningLabel->setAttributedText(_upgradeWarningText());
    _warningLabel->setTextAlignment(TextAlignment::center);
    _warningLabel->setNumberOfLines(0);
    _warningLabel->setAlpha(0);
    add(*_contentView, _warningLabel, "_warningLabel");

    _spinner =
        std::make_shared<ActivityIndicatorView>(services(), ActivityIndicatorViewStyle::gray);
    add(*_contentView, _spinner, "_spinner");

    const std::shared_ptr<Bundle> ownBundle = _ownBundle();
    _cloudDriveLogo = std::make_shared<ImageView>(
        services(), ownBundle ? ownBundle->imageNamed("NimbraDrive") : nullptr);
    add(*_contentView, _cloudDriveLogo, "_cloudDriveLogo");

    _upgradeButton = Button::buttonWithType(ButtonType::system, services());
    _upgradeButton->setTitleForState(_ownLocalizedString("CLOUD_DRIVE_UPGRADE_BUTTON"),
                                     ControlState::normal);
    _upgradeButton->addTargetActionForControlEvents(
        weak_from_this(),
        [this](const std::shared_ptr<Button>& sender) { _upgradeButtonWasTapped(sender); },
        ControlEvent::touchUpInside);
    _upgradeButton->setTintColor(Color::systemBlue);
    _upgradeButton->setUserInteractionEnabled(true);
    _upgradeButton->setEnabled(false);
    _upgradeButton->setAlpha(0);
    _upgradeButton->titleLabel()->setFont(services().deviceInfo->userInterfaceIdiom() ==
                                                  UserInterfaceIdiom::pad
                                              ? Font::_thinSystemFontOfSize(25.0)
                                              : Font::_lightSystemFontOfSize(19.0));
    add(*_contentView, _upgradeButton, "_upgradeButton");

    // Never shown: the screen has no rows.
    setTable(std::make_shared<Table>(services(), Rect(), TableStyle::plain));
    table()->setHidden(true);
    add(*_contentView, table(), "_table");

    setView(_scrollView);
}

void RSPUpgradeViewController::viewDidLoad() {
    AccountSettingsPane::viewDidLoad();
    setTitle(_ownLocalizedString("CLOUD_DRIVE"));
    if (!isPresentedAsModalSheet()) {
        navigationItem().setLeftBarButtonItem(std::nullopt);
    }
    navigationItem().setRightBarButtonItem(std::nullopt);
    _loadListOfDevicesImpactedByMigration();
}

// Each view has its frame before the next one is measured.
void RSPUpgradeViewController::viewWillLayoutSubviews() {
    AccountSettingsPane::viewWillLayoutSubviews();
    const double width = view()->frame().size.width;
    const std::optional<Screen> mainScreen = services().deviceInfo->mainScreen();
    const auto centred = [&](double extent) {
        return RoundToViewScale((width - extent) * 0.5, mainScreen);
    };
    // Less than nothing where the view is narrower than its margins.
    const auto within = [width](double margin) { return width - (2 * margin); };
    constexpr double padTextMargin = 36;
    constexpr double textMargin = 16;
    constexpr double padButtonMargin = 44;
    constexpr double buttonMargin = 14;

    const double buttonWidth = within(_margin(padButtonMargin, buttonMargin));

    _cloudDriveLogo->sizeToFit();
    const Size logo = _cloudDriveLogo->frame().size;
    _cloudDriveLogo->setFrame({.origin = {.x = centred(logo.width), .y = 28}, .size = logo});

    const double titleY = 28 + logo.height + 13;
    const double titleWidth = within(_margin(padTextMargin, textMargin));
    const double titleHeight = _heightForTextWithFontConstrainedToWidth(
        _titleLabel->text(), _titleLabel->font(), titleWidth);
    _titleLabel->setFrame({.origin = {.x = _margin(padTextMargin, textMargin), .y = titleY},
                           .size = {.width = titleWidth, .height = titleHeight}});

    // Measured before the label has its frame, at the width of the pass before: 0 in the first one.
    // Meant so; the pass that the device list asks for measures at the right width.
    const double warningY = titleY + titleHeight + 11;
    const double warningHeight = _heightForAttributedTextInLabel(*_warningLabel);
    _warningLabel->setFrame(
        {.origin = {.x = _margin(padTextMargin, textMargin), .y = warningY},
         .size = {.width = within(_margin(padTextMargin, textMargin)), .height = warningHeight}});

    // Over the top of the warning, which cannot be seen while the spinner turns.
    const Size spinner = _spinner->frame().size;
    _spinner->setFrame(
        {.origin = {.x = centred(spinner.width), .y = titleY + titleHeight + 30}, .size = spinner});

    _upgradeButton->sizeToFit();
    const double buttonHeight = _upgradeButton->frame().size.height;
    const double buttonY = warningY + warningHeight + 16;
    _upgradeButton->setFrame({.origin = {.x = _margin(padButtonMargin, buttonMargin), .y = buttonY},
                              .size = {.width = buttonWidth, .height = buttonHeight}});

    const Size content{.width = width, .height = buttonY + buttonHeight + 30};
    _contentView->setFrame({.origin = _contentView->frame().origin, .size = content});
    _scrollView->setContentSize(content);
}

double RSPUpgradeViewController::_margin(double onPad, double elsewhere) const {
    return services().deviceInfo->userInterfaceIdiom() == UserInterfaceIdiom::pad ? onPad
                                                                                  : elsewhere;
}

double RSPUpgradeViewController::_heightForTextWithFontConstrainedToWidth(const Text& text,
                                                                          const Font& font,
                                                                          double width) const {
    const AttributedString styled(
        text, {.FontAttributeName = font, .ParagraphStyleAttributeName = ParagraphStyle()});
    return std::ceil(services().viewMetrics->sizeOfText(styled, width, 0).height);
}

double RSPUpgradeViewController::_heightForAttributedTextInLabel(const Label& label) const {
    const AttributedString text = label.attributedText().value_or(AttributedString());
    return std::ceil(services().viewMetrics->sizeOfText(text, label.frame().size.width, 0).height);
}

std::shared_ptr<Account> RSPUpgradeViewController::_account() const {
    return userInfoValue<std::shared_ptr<Account>>(specifier()->userInfo(), AccountKey);
}

std::shared_ptr<Bundle> RSPUpgradeViewController::_paneBundle() const {
    return services().bundles->bundleWithIdentifier(
        BundleIdentifier("com.vantrel.NimbraDriveSettings"));
}

std::shared_ptr<Bundle> RSPUpgradeViewController::_ownBundle() const {
    return services().bundles->bundleForClass(typeid(RSPUpgradeViewController));
}

Text RSPUpgradeViewController::_localizedString(const Text& key) const {
    return RSPLocalizedString(key, "Localizable", _paneBundle());
}

Text RSPUpgradeViewController::_ownLocalizedString(const Text& key) const {
    return RSPLocalizedString(key, "Localizable", _ownBundle());
}

std::shared_ptr<RSPUpgradeViewController> RSPUpgradeViewController::sharedFromThis() {
    return std::static_pointer_cast<RSPUpgradeViewController>(shared_from_this());
}

} // namespace nimbra
