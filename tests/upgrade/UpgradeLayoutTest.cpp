#include "host/core/FixedViewMetrics.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ScrollView.h"
#include "tests/upgrade/UpgradeFixture.h"

#include <cmath>
#include <gmock/gmock.h>

namespace nimbra::test {
namespace {

Rect rect(double x, double y, double width, double height) {
    return {.origin = {.x = x, .y = y}, .size = {.width = width, .height = height}};
}

/// The screen measured by the rules of the host without a display: a character is half as wide as
/// its font is large, a line 1.2 times as high.
struct UpgradeLayout : UpgradeFixture {
    host::FixedViewMetrics metrics;

    UpgradeLayout() {
        PlatformServices services = platform.services();
        services.viewMetrics = metrics;
        screen = std::make_shared<OpenScreen>(services);
        screen->setSpecifier(entry);
        screen->setDelegate(delegate);
        sheet = std::make_shared<SetupController>(screen);
        screen->setParentController(sheet);
    }

    void layOut(double width, double height) {
        screen->view()->setFrame(rect(0, 0, width, height));
        screen->view()->setNeedsLayout();
        screen->layoutViewIfNeeded();
    }
    [[nodiscard]] Rect frame(const char* name) const {
        return screen->viewNamed<View>(name)->frame();
    }
    [[nodiscard]] Size contentSize() const {
        return screen->viewNamed<ScrollView>("_scrollView")->contentSize();
    }
    void setText(const char* key, const std::string& text) {
        auto changed = texts();
        changed[key] = Text(text);
        const auto logo = platform.bundles.paneBundle->images;
        platform.bundles.paneBundle = std::make_shared<FakeBundle>(changed);
        platform.bundles.paneBundle->images = logo;
        platform.bundles.bundleOfClasses = platform.bundles.paneBundle;
    }
    /// The three widths that are the view's less its margins, below 0 where those are wider.
    void expectWidths(double textWidth, double buttonWidth) const {
        EXPECT_EQ(frame("_titleLabel").size.width, textWidth);
        EXPECT_EQ(frame("_warningLabel").size.width, textWidth);
        EXPECT_EQ(frame("_upgradeButton").size.width, buttonWidth);
    }
    void expectNoHeightBelow0() const {
        for (const char* name : {"_scrollView", "_contentView", "_titleLabel", "_warningLabel",
                                 "_spinner", "_cloudDriveLogo", "_upgradeButton"}) {
            EXPECT_GE(frame(name).size.height, 0) << name;
        }
        EXPECT_GE(contentSize().height, 0);
    }
};

TEST_F(UpgradeLayout, OnAPhoneThePassesBeforeAndAfterTheDevicesAreKnown) {
    screen->loadViewIfNeeded();
    screen->layoutViewIfNeeded();

    EXPECT_EQ(frame("_cloudDriveLogo"), rect(147, 28, 96, 64));
    // A line of 32 points is 38.4 high.
    EXPECT_EQ(frame("_titleLabel"), rect(16, 105, 358, 39));
    // Measured at no width, every word stands alone: two lines 2 closer than 20.4, 8 more, and the
    // empty line behind the last break.
    EXPECT_EQ(frame("_warningLabel"), rect(16, 155, 358, 68));
    EXPECT_EQ(frame("_spinner"), rect(185, 174, 20, 20));
    // A title of 19 points is 22.8 high, a button 12 higher.
    EXPECT_EQ(frame("_upgradeButton"), rect(14, 239, 362, 34.8));
    EXPECT_EQ(frame("_contentView"), rect(0, 0, 390, 303.8));
    EXPECT_EQ(contentSize(), (Size{390, 303.8}));

    platform.deviceListRequests.answer(std::nullopt);
    platform.workQueues.mainQueue().pump();
    screen->layoutViewIfNeeded();

    // One line, 8 more, and the empty one.
    EXPECT_EQ(frame("_warningLabel"), rect(16, 155, 358, 49));
    EXPECT_EQ(frame("_upgradeButton"), rect(14, 220, 362, 34.8));
    EXPECT_EQ(contentSize(), (Size{390, 284.8}));
}

TEST_F(UpgradeLayout, OnAPadTheMarginsAndTheButtonAreLarger) {
    platform.deviceInfo.idiom = UserInterfaceIdiom::pad;
    screen->loadViewIfNeeded();
    layOut(540, 620);
    layOut(540, 620);

    EXPECT_EQ(frame("_cloudDriveLogo"), rect(222, 28, 96, 64));
    EXPECT_EQ(frame("_titleLabel"), rect(36, 105, 468, 39));
    EXPECT_EQ(frame("_warningLabel"), rect(36, 155, 468, 49));
    EXPECT_EQ(frame("_spinner"), rect(260, 174, 20, 20));
    EXPECT_EQ(frame("_upgradeButton"), rect(44, 220, 452, 42));
    EXPECT_EQ(contentSize(), (Size{540, 292}));
}

TEST_F(UpgradeLayout, AsksForTheIdiomForEachValueAfresh) {
    screen->loadViewIfNeeded();
    const int before = platform.deviceInfo.idiomQuestions;

    layOut(390, 844);

    // The widths of button, title and warning, and where each of them begins.
    EXPECT_EQ(platform.deviceInfo.idiomQuestions - before, 6);
}

TEST_F(UpgradeLayout, WithoutAMainScreenFollowsTheRootView) {
    platform.deviceInfo.screen.reset();
    screen->loadViewIfNeeded();
    screen->layoutViewIfNeeded();
    expectWidths(-32, -28);
    expectNoHeightBelow0();
    EXPECT_EQ(contentSize().width, 0);

    layOut(391, 844);

    // Without a screen a point is a pixel.
    EXPECT_EQ(frame("_cloudDriveLogo"), rect(148, 28, 96, 64));
    EXPECT_EQ(frame("_titleLabel").size.width, 359);
    EXPECT_EQ(contentSize().width, 391);
}

TEST_F(UpgradeLayout, StandsOnThePixelsOfTheScreen) {
    platform.deviceInfo.screen->scale = 2;
    screen->loadViewIfNeeded();
    layOut(391, 844);
    EXPECT_EQ(frame("_cloudDriveLogo").origin.x, 147.5);
    EXPECT_EQ(frame("_spinner").origin.x, 185.5);

    platform.deviceInfo.screen->scale = 1;
    layOut(391, 844);
    EXPECT_EQ(frame("_cloudDriveLogo").origin.x, 148);

    platform.deviceInfo.screen->scale = 3;
    layOut(390.5, 844);
    EXPECT_EQ(frame("_cloudDriveLogo").origin.x, 442.0 / 3);
}

TEST_F(UpgradeLayout, MeasuresTheWarningAtTheWidthOfThePassBefore) {
    screen->loadViewIfNeeded();
    layOut(390, 844);
    layOut(390, 844);
    EXPECT_EQ(frame("_warningLabel").size, (Size{358, 49}));

    // Too narrow for one line, but that is measured in the next pass only.
    layOut(132, 844);
    EXPECT_EQ(frame("_warningLabel").size, (Size{100, 49}));
    layOut(132, 844);
    EXPECT_EQ(frame("_warningLabel").size, (Size{100, 68}));
}

TEST_F(UpgradeLayout, ALongTitlePushesWhatIsBelow) {
    setText("CLOUD_DRIVE_UPGRADE_TITLE", "Move everything to the new place");
    screen->loadViewIfNeeded();

    layOut(390, 844);

    // 32 characters of 16 points, 22 of which fit a line.
    EXPECT_EQ(frame("_titleLabel"), rect(16, 105, 358, 77));
    EXPECT_EQ(frame("_warningLabel").origin.y, 193);
    EXPECT_EQ(frame("_spinner").origin.y, 212);
}

TEST_F(UpgradeLayout, AMissingTitleHasNoHeight) {
    // The logo goes with it: both are of the bundle that has the screen's class.
    platform.bundles.bundleOfClasses = nullptr;
    screen->loadViewIfNeeded();

    layOut(390, 844);

    EXPECT_EQ(frame("_titleLabel"), rect(16, 41, 358, 0));
    EXPECT_EQ(frame("_warningLabel").origin.y, 52);
}

TEST_F(UpgradeLayout, WithoutALogoTheTitleStandsHigher) {
    platform.bundles.bundleOfClasses = std::make_shared<FakeBundle>(texts());
    screen->loadViewIfNeeded();

    layOut(390, 844);

    EXPECT_EQ(frame("_cloudDriveLogo"), rect(195, 28, 0, 0));
    EXPECT_EQ(frame("_titleLabel").origin.y, 41);
}

TEST_F(UpgradeLayout, ManyDevicesMakeTheContentTallerThanTheScreen) {
    showDevices({}, std::vector<Text>(50, "A device"));
    layOut(390, 844);
    layOut(390, 844);

    // Names stand line under line: 50 and the one that the sentences share with the first.
    EXPECT_GT(contentSize().height, 844);
    EXPECT_GT(contentSize().height, 50 * 20.4);
    EXPECT_EQ(frame("_contentView").size, contentSize());
}

TEST_F(UpgradeLayout, HasRoomForEveryNameAtEveryWidth) {
    const std::string longName(10'000, 'x');
    const std::vector<Text> names{"جهاز قديم جدًا",         "古いタブレット", Text(longName), "",
                                  "{0} \"quoted\" 'name'", "two\nlines"};
    showDevices(names, names);
    for (const UserInterfaceIdiom idiom : {UserInterfaceIdiom::phone, UserInterfaceIdiom::pad}) {
        platform.deviceInfo.idiom = idiom;
        const bool isPad = idiom == UserInterfaceIdiom::pad;
        for (const double width : {0.0, 1.0, 28.0, 88.0, 320.0, 390.0, 768.0, 1024.0}) {
            layOut(width, 600);
            layOut(width, 600);

            expectWidths(width - (isPad ? 72 : 32), width - (isPad ? 88 : 28));
            expectNoHeightBelow0();
            EXPECT_EQ(contentSize().width, width);
            EXPECT_EQ(contentSize().height,
                      frame("_upgradeButton").origin.y + frame("_upgradeButton").size.height + 30);
        }
    }
}

TEST_F(UpgradeLayout, ALongNameStandsAloneOnItsLine) {
    showDevices({}, std::vector<Text>{Text(std::string(10'000, 'x')), "short"});
    layOut(390, 844);
    layOut(390, 844);

    // The sentences have no blank before the first name, and "[many" and "cannot]..." part.
    EXPECT_EQ(frame("_warningLabel").size, (Size{358, 68}));
}

TEST_F(UpgradeLayout, ATitleOfTheButtonHasTheLinesThatItsTextSays) {
    setText("CLOUD_DRIVE_UPGRADE_BUTTON", "Go\nnow please");
    screen->loadViewIfNeeded();

    layOut(390, 844);

    EXPECT_EQ(frame("_upgradeButton").size, (Size{362, 57.6}));
}

TEST_F(UpgradeLayout, GrowsWithEachNameThatComesToTheList) {
    double lowest = 0;
    for (std::size_t count = 1; count <= 40; ++count) {
        screen->_devicesThatCannotUpgrade = std::vector<Text>(count, "An old device");
        Label label(platform.services(), rect(0, 0, 300, 0));
        label.setAttributedText(screen->_upgradeWarningText());

        const double height = screen->_heightForAttributedTextInLabel(label);

        EXPECT_GT(height, lowest) << count;
        EXPECT_EQ(height, std::ceil(height));
        lowest = height;
    }
}

TEST_F(UpgradeLayout, AbsentTextsHaveNoHeight) {
    const Label label(platform.services(), rect(0, 0, 300, 0));

    EXPECT_EQ(screen->_heightForAttributedTextInLabel(label), 0);
    EXPECT_EQ(screen->_heightForTextWithFontConstrainedToWidth(Text(), Font(), 300), 0);
}

TEST_F(UpgradeLayout, HeightsAreWholePoints) {
    const Font font{.pointSize = 17};

    EXPECT_EQ(screen->_heightForTextWithFontConstrainedToWidth("one line", font, 300), 21);
    // Five lines are 102 high, to the last bit.
    EXPECT_EQ(screen->_heightForTextWithFontConstrainedToWidth("a\nb\nc\nd\ne", font, 300), 102);
}

TEST_F(UpgradeLayout, KeepsTheOriginOfTheContentAndTheSizeOfTheSpinner) {
    screen->loadViewIfNeeded();
    screen->viewNamed<View>("_contentView")->setFrame(rect(3, 4, 0, 0));
    screen->viewNamed<View>("_spinner")->setFrame(rect(0, 0, 37, 37));

    layOut(390, 844);

    EXPECT_EQ(frame("_contentView").origin, (Point{3, 4}));
    EXPECT_EQ(frame("_spinner"), rect(176.5, 174, 37, 37));
}

TEST_F(UpgradeLayout, OnAPadATitleThatTheMarginsLeaveNoRoomForIsBroken) {
    platform.deviceInfo.idiom = UserInterfaceIdiom::pad;
    setText("CLOUD_DRIVE_UPGRADE_TITLE", "Move all you have to the cloud");
    screen->loadViewIfNeeded();

    layOut(540, 620);

    // 30 characters of 16 points are 480 wide: the screen has room for them, the margins do not.
    EXPECT_EQ(frame("_titleLabel"), rect(36, 105, 468, 77));
}

TEST_F(UpgradeLayout, GivesTheLogoTheSizeOfItsImageWhateverItHad) {
    screen->loadViewIfNeeded();
    screen->viewNamed<View>("_cloudDriveLogo")->setFrame(rect(0, 0, 10, 10));

    layOut(390, 844);

    EXPECT_EQ(frame("_cloudDriveLogo"), rect(147, 28, 96, 64));
    EXPECT_EQ(frame("_titleLabel").origin.y, 105);
}

} // namespace
} // namespace nimbra::test
