#include "host/core/ScreenDescription.h"

#include "platform/host/SettingsListController.h"
#include "platform/views/ActivityIndicatorView.h"
#include "platform/views/Button.h"
#include "platform/views/ImageView.h"
#include "platform/views/Label.h"
#include "platform/views/ScrollView.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>
#include <nlohmann/json.hpp>

namespace nimbra::host {
namespace {

/// A page that shows the view it is given.
class Page final : public SettingsListController {
public:
    Page(const PlatformServices& services, std::shared_ptr<View> root, Text title)
        : SettingsListController(services) {
        setView(std::move(root));
        setTitle(std::move(title));
    }
    const SpecifierArray& specifiers() override { return _rows; }

private:
    SpecifierArray _rows;
};

struct ScreenDescriptionTest : testing::Test {
    test::TestPlatform platform;
    PlatformServices services = platform.services();
};

std::string json(const View& view) {
    return ViewDescription::of(view).json().dump();
}

TEST_F(ScreenDescriptionTest, SaysOfAnyViewWhereItStandsAndWhetherItCanBeSeen) {
    const auto view = std::make_shared<View>(
        services, Rect{.origin = {.x = 1, .y = 2.5}, .size = {.width = 3, .height = 4}});
    view->setAccessibilityIdentifier("_contentView");
    view->setAlpha(0.25);
    view->setHidden(true);

    EXPECT_EQ(json(*view), R"({"name":"_contentView","class":"View","frame":[1.0,2.5,3.0,4.0],)"
                           R"("alpha":0.25,"hidden":true})");
    EXPECT_EQ(json(*std::make_shared<View>(services, Rect())),
              R"({"name":null,"class":"View","frame":[0.0,0.0,0.0,0.0],)"
              R"("alpha":1.0,"hidden":false})");
}

TEST_F(ScreenDescriptionTest, SaysWhatALabelSaysAndHow) {
    Label label(services, Rect());
    label.setText("Hello");
    label.setFont(Font::_lightSystemFontOfSize(32));

    const auto plain = ViewDescription::of(label).json();
    EXPECT_EQ(plain["class"], "Label");
    EXPECT_EQ(plain["text"], "Hello");
    EXPECT_EQ(plain["font"].dump(), R"({"weight":"light","size":32.0})");
    EXPECT_FALSE(plain.contains("runs"));
    EXPECT_FALSE(plain.contains("enabled"));

    label.setText(Text());
    EXPECT_TRUE(ViewDescription::of(label).json()["text"].is_null());
}

TEST_F(ScreenDescriptionTest, SaysOfAStyledTextWhichStretchesAreBoldAndCompact) {
    Label label(services, Rect());
    const ParagraphStyle regular{.paragraphSpacing = 8};
    MutableAttributedString text("plain ", {.ParagraphStyleAttributeName = regular});
    text.appendAttributedString({"bold",
                                 {.FontAttributeName = Font::boldSystemFontOfSize(17),
                                  .ParagraphStyleAttributeName = regular}});
    text.appendAttributedString({"stack", {.FontAttributeName = Font::boldSystemFontOfSize(17)}});
    label.setAttributedText(text);

    const auto styled = ViewDescription::of(label).json();
    EXPECT_EQ(styled["text"], "plain boldstack");
    EXPECT_EQ(styled["runs"].dump(), R"([{"text":"plain ","bold":false,"compact":false},)"
                                     R"({"text":"bold","bold":true,"compact":false},)"
                                     R"({"text":"stack","bold":true,"compact":true}])");
}

TEST_F(ScreenDescriptionTest, SaysWhatAButtonIsCalledAndWhetherItCanBeTouched) {
    const auto button = Button::buttonWithType(ButtonType::system, services);
    button->setTitleForState("Go", ControlState::normal);
    button->setEnabled(false);
    button->titleLabel()->setFont(Font::_thinSystemFontOfSize(25));

    const auto described = ViewDescription::of(*button).json();
    EXPECT_EQ(described["class"], "Button");
    EXPECT_EQ(described["text"], "Go");
    EXPECT_EQ(described["enabled"], false);
    EXPECT_EQ(described["font"].dump(), R"({"weight":"thin","size":25.0})");
}

TEST_F(ScreenDescriptionTest, SaysWhetherASpinnerTurns) {
    ActivityIndicatorView spinner(services, ActivityIndicatorViewStyle::gray);
    EXPECT_EQ(ViewDescription::of(spinner).json()["animating"], false);

    spinner.startAnimating();

    EXPECT_EQ(ViewDescription::of(spinner).json()["animating"], true);
    EXPECT_EQ(ViewDescription::of(spinner).className, "ActivityIndicatorView");
}

TEST_F(ScreenDescriptionTest, NamesTheOtherKindsOfViews) {
    EXPECT_EQ(ViewDescription::of(ImageView(services, nullptr)).className, "ImageView");
    EXPECT_EQ(ViewDescription::of(ScrollView(services, Rect())).className, "ScrollView");
    EXPECT_EQ(ViewDescription::of(Table(services, Rect(), TableStyle::plain)).className, "Table");
}

TEST_F(ScreenDescriptionTest, ListsTheViewsOfAScreenFromTheRootDown) {
    const auto root = std::make_shared<ScrollView>(services, Rect());
    const auto content = std::make_shared<View>(services, Rect());
    content->addSubview(std::make_shared<Label>(services, Rect()));
    root->addSubview(content);
    root->addSubview(std::make_shared<ImageView>(services, nullptr));
    root->setContentSize({.width = 10, .height = 20});
    Page page(services, root, "Title");
    page.navigationItem().setLeftBarButtonItem(
        BarButtonItem{.systemItem = BarButtonSystemItem::cancel});
    page.navigationItem().setRightBarButtonItem(BarButtonItem{.title = "Next"});

    const auto screen = ScreenDescription::of(page);

    EXPECT_EQ(screen.title, Text("Title"));
    EXPECT_EQ(screen.leftBarButton, Text("cancel"));
    EXPECT_EQ(screen.rightBarButton, Text("Next"));
    EXPECT_EQ(screen.contentSize, (Size{10, 20}));
    std::vector<std::string> classes;
    for (const ViewDescription& view : screen.views) {
        classes.push_back(view.className);
    }
    EXPECT_EQ(classes, (std::vector<std::string>{"ScrollView", "View", "Label", "ImageView"}));
}

TEST_F(ScreenDescriptionTest, OfAScreenThatDoesNotScrollTheContentIsTheView) {
    const auto root =
        std::make_shared<View>(services, Rect{.origin = {}, .size = {.width = 5, .height = 6}});
    Page page(services, root, Text());
    page.navigationItem().setRightBarButtonItem(
        BarButtonItem{.systemItem = BarButtonSystemItem::done});

    const auto screen = ScreenDescription::of(page);

    EXPECT_EQ(screen.contentSize, (Size{5, 6}));
    EXPECT_EQ(screen.leftBarButton, Text());
    EXPECT_EQ(screen.rightBarButton, Text("done"));
}

TEST_F(ScreenDescriptionTest, NamesEveryWeight) {
    EXPECT_EQ(nameOf(FontWeight::thin), "thin");
    EXPECT_EQ(nameOf(FontWeight::light), "light");
    EXPECT_EQ(nameOf(FontWeight::regular), "regular");
    EXPECT_EQ(nameOf(FontWeight::bold), "bold");
}

} // namespace
} // namespace nimbra::host
