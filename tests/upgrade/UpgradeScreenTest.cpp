#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ScrollView.h"
#include "platform/views/Table.h"
#include "tests/upgrade/UpgradeFixture.h"

#include <gmock/gmock.h>
#include <typeinfo>

namespace nimbra::test {
namespace {

struct UpgradeScreen : UpgradeFixture {
    [[nodiscard]] std::vector<std::string> contentNames() const {
        std::vector<std::string> names;
        for (const auto& view : screen->viewNamed<View>("_contentView")->subviews()) {
            names.push_back(view->accessibilityIdentifier());
        }
        return names;
    }
};

TEST_F(UpgradeScreen, HasNoRows) {
    EXPECT_TRUE(screen->specifiers().empty());
    EXPECT_TRUE(screen->specifiers().empty());
}

TEST_F(UpgradeScreen, HasOneContentViewInAWhiteScrollViewOfTheScreensSize) {
    platform.deviceInfo.screen =
        Screen{.bounds = {.origin = {.x = 1, .y = 2}, .size = {400, 900}}, .scale = 3};

    screen->loadViewIfNeeded();

    const auto root = std::dynamic_pointer_cast<ScrollView>(screen->view());
    ASSERT_NE(root, nullptr);
    EXPECT_EQ(root->frame(), platform.deviceInfo.screen->bounds);
    EXPECT_EQ(root->backgroundColor(), Color::white);
    ASSERT_EQ(root->subviews().size(), 1U);
    EXPECT_EQ(root->subviews().front(), screen->viewNamed<View>("_contentView"));
    EXPECT_EQ(root->subviews().front()->frame(), Rect());
}

TEST_F(UpgradeScreen, WithoutAMainScreenStartsWithNoSize) {
    platform.deviceInfo.screen.reset();

    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->view()->frame(), Rect());
}

TEST_F(UpgradeScreen, HasItsViewsInTheOrderInWhichTheyAreMade) {
    screen->loadViewIfNeeded();

    EXPECT_THAT(contentNames(),
                testing::ElementsAre("_titleLabel", "_warningLabel", "_spinner", "_cloudDriveLogo",
                                     "_upgradeButton", "_table"));
}

TEST_F(UpgradeScreen, HasALargeLightTitleOfAsManyLinesAsItTakes) {
    screen->loadViewIfNeeded();

    const auto title = screen->viewNamed<Label>("_titleLabel");
    EXPECT_EQ(title->text(), Text("[title]"));
    EXPECT_EQ(title->font(), (Font{.pointSize = 32, .weight = FontWeight::light}));
    EXPECT_EQ(title->textAlignment(), TextAlignment::center);
    EXPECT_EQ(title->numberOfLines(), 0);
    EXPECT_EQ(title->frame(), Rect());
    EXPECT_EQ(title->alpha(), 1);
}

TEST_F(UpgradeScreen, HidesTheWarningUntilTheDevicesAreKnown) {
    screen->loadViewIfNeeded();

    const auto warning = screen->viewNamed<Label>("_warningLabel");
    ASSERT_TRUE(warning->attributedText());
    EXPECT_EQ(warning->attributedText()->string(), "[header][none known][end]\n");
    EXPECT_EQ(warning->textAlignment(), TextAlignment::center);
    EXPECT_EQ(warning->numberOfLines(), 0);
    EXPECT_EQ(warning->frame(), Rect());
    EXPECT_EQ(warning->alpha(), 0);
}

TEST_F(UpgradeScreen, HasAGraySpinner) {
    screen->loadViewIfNeeded();

    const auto spinner = screen->viewNamed<ActivityIndicatorView>("_spinner");
    EXPECT_EQ(spinner->style(), ActivityIndicatorViewStyle::gray);
    EXPECT_EQ(spinner->frame().size, (Size{20, 20}));
}

TEST_F(UpgradeScreen, TakesTheLogoFromTheBundleOfItsClass) {
    platform.bundles.paneBundle = std::make_shared<FakeBundle>(texts());

    screen->loadViewIfNeeded();

    // For it, the title, the button's title and the bar's.
    EXPECT_THAT(
        platform.bundles.classesAskedFor,
        testing::AllOf(testing::SizeIs(4), testing::Each(typeid(RSPUpgradeViewController).name())));
    const auto logo = screen->viewNamed<ImageView>("_cloudDriveLogo");
    ASSERT_NE(logo->image(), nullptr);
    EXPECT_EQ(logo->image()->name, Text("NimbraDrive"));
}

TEST_F(UpgradeScreen, DoesWithoutALogoThatIsNotThere) {
    platform.bundles.bundleOfClasses = nullptr;

    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->viewNamed<ImageView>("_cloudDriveLogo")->image(), nullptr);
}

TEST_F(UpgradeScreen, HasABlueButtonThatCannotBeTouchedYet) {
    screen->loadViewIfNeeded();

    const auto button = screen->viewNamed<Button>("_upgradeButton");
    EXPECT_EQ(button->buttonType(), ButtonType::system);
    EXPECT_EQ(button->titleForState(ControlState::normal), Text("[button]"));
    EXPECT_EQ(button->tintColor(), Color::systemBlue);
    EXPECT_TRUE(button->isUserInteractionEnabled());
    EXPECT_FALSE(button->isEnabled());
    EXPECT_EQ(button->alpha(), 0);
    EXPECT_EQ(button->titleLabel()->font(), (Font{.pointSize = 19, .weight = FontWeight::light}));
}

TEST_F(UpgradeScreen, OnAPadTheButtonsTitleIsLargerAndThin) {
    platform.deviceInfo.idiom = UserInterfaceIdiom::pad;

    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->viewNamed<Button>("_upgradeButton")->titleLabel()->font(),
              (Font{.pointSize = 25, .weight = FontWeight::thin}));
}

TEST_F(UpgradeScreen, HidesThePlainTableThatReplacesTheListsOwn) {
    const auto before = screen->table();

    screen->loadViewIfNeeded();

    const auto table = screen->viewNamed<Table>("_table");
    EXPECT_EQ(table, screen->table());
    EXPECT_NE(table, before);
    EXPECT_EQ(table->style(), TableStyle::plain);
    EXPECT_TRUE(table->isHidden());
}

TEST_F(UpgradeScreen, IsCalledWhatThePageIsCalled) {
    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->title(), Text("[page]"));
}

TEST_F(UpgradeScreen, InASheetKeepsTheCancelButtonOnly) {
    screen->loadViewIfNeeded();

    ASSERT_TRUE(screen->navigationItem().leftBarButtonItem());
    EXPECT_EQ(screen->navigationItem().leftBarButtonItem()->systemItem,
              BarButtonSystemItem::cancel);
    EXPECT_FALSE(screen->navigationItem().rightBarButtonItem());
}

TEST_F(UpgradeScreen, ElsewhereHasNoBarButtons) {
    screen->setParentController(parent);

    screen->loadViewIfNeeded();

    EXPECT_FALSE(screen->navigationItem().leftBarButtonItem());
    EXPECT_FALSE(screen->navigationItem().rightBarButtonItem());
}

TEST_F(UpgradeScreen, TheBarsCancelButtonLeavesIt) {
    screen->loadViewIfNeeded();
    const BarButtonItem cancel = *screen->navigationItem().leftBarButtonItem();

    cancel.action(cancel);

    ASSERT_EQ(delegate->ended.size(), 1U);
    EXPECT_EQ(delegate->ended.front().how, "cancel");
}

TEST_F(UpgradeScreen, HoldsItsDelegateWeakly) {
    EXPECT_EQ(screen->delegate(), delegate);

    delegate.reset();

    EXPECT_EQ(screen->delegate(), nullptr);
}

TEST_F(UpgradeScreen, AsksForTheDevicesWhenItsBarIsReady) {
    // The request is the last thing: whoever answers at once finds the screen complete.
    std::string atRequest = "not asked";
    platform.deviceListRequests.onRequest = [&] {
        const NavigationItem& bar = screen->navigationItem();
        atRequest =
            screen->title().string() + (bar.leftBarButtonItem() ? ", left" : "") +
            (bar.rightBarButtonItem() ? ", right" : "") +
            (screen->viewNamed<ActivityIndicatorView>("_spinner")->isAnimating() ? ", spinning"
                                                                                 : "");
    };

    screen->loadViewIfNeeded();

    EXPECT_EQ(atRequest, "[page], left, spinning");
    EXPECT_EQ(platform.calls, std::vector<std::string>());
}

TEST_F(UpgradeScreen, HasItsTitlesWithoutABundleOfThePagesName) {
    platform.bundles.paneBundle = nullptr;

    screen->loadViewIfNeeded();

    EXPECT_EQ(screen->title(), Text("[page]"));
    EXPECT_EQ(screen->viewNamed<Label>("_titleLabel")->text(), Text("[title]"));
    EXPECT_EQ(screen->viewNamed<Button>("_upgradeButton")->titleForState(ControlState::normal),
              Text("[button]"));
    // The warning is of the bundle that goes by the name.
    EXPECT_EQ(screen->viewNamed<Label>("_warningLabel")->attributedText()->string(), "\n");
    EXPECT_TRUE(syslog.lines.empty());
}

TEST_F(UpgradeScreen, OfTheTitlesOfItsOwnBundleMissingOnesAreReported) {
    platform.bundles.bundleOfClasses = std::make_shared<FakeBundle>(std::map<std::string, Text>());

    screen->loadViewIfNeeded();

    EXPECT_THAT(missingKeys(), testing::ElementsAre("CLOUD_DRIVE_UPGRADE_TITLE",
                                                    "CLOUD_DRIVE_UPGRADE_BUTTON", "CLOUD_DRIVE"));
    EXPECT_EQ(screen->title(), Text("RSP_LOCALIZED_STRING_UNAVAILABLE"));
}

TEST_F(UpgradeScreen, KeepsTheRowsThatItsListWasGiven) {
    static_cast<void>(screen->specifiers());
    const auto row = Specifier::preferenceSpecifierNamed("Row", {.cell = ButtonCell});

    screen->addSpecifiersFromArrayAnimated({row}, false);

    EXPECT_THAT(screen->specifiers(), testing::ElementsAre(row));
}

} // namespace
} // namespace nimbra::test
