#include "platform/system/Syslog.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "tests/support/TestPlatform.h"

#include <cmath>
#include <gtest/gtest.h>
#include <string>
#include <syslog.h>
#include <utility>
#include <vector>

namespace nimbra {
namespace {

/// A bar above a caption of 10 characters, 6 points each; a line is 14.4 points high.
struct ConstraintLayoutTest : testing::Test {
    test::TestPlatform platform;
    std::vector<std::pair<int, std::string>> lines;
    SyslogSink sinkBefore;
    std::shared_ptr<View> root = std::make_shared<View>(platform.services(), Rect{});
    std::shared_ptr<ProgressView> bar =
        std::make_shared<ProgressView>(platform.services(), ProgressViewStyle::standard);
    std::shared_ptr<Label> label = std::make_shared<Label>(platform.services(), Rect{});

    void SetUp() override {
        sinkBefore = replaceSyslogSink([this](int priority, const std::string& message) {
            lines.emplace_back(priority, message);
        });
        for (const std::shared_ptr<View>& view : {std::shared_ptr<View>(bar), {label}}) {
            view->setTranslatesAutoresizingMaskIntoConstraints(false);
            root->addSubview(view);
        }
        label->setFont(platform.viewMetrics.preferredFontForTextStyle(FontTextStyleCaption1));
        label->setNumberOfLines(0);
        label->setText("0123456789");
    }
    void TearDown() override { replaceSyslogSink(std::move(sinkBefore)); }

    void add(const std::string& format) {
        auto constraints = LayoutConstraint::constraintsWithVisualFormat(
            format, {.metrics = {{"progressMargin", 50}},
                     .views = {{"_progressBar", bar.get()}, {"_statusLabel", label.get()}}});
        ASSERT_TRUE(constraints) << constraints.error();
        root->addConstraints(std::move(*constraints));
    }
    void addStatusLayout() {
        add("H:|-[_statusLabel]-|");
        add("H:|-(progressMargin)-[_progressBar]-(progressMargin)-|");
        add("V:|[_progressBar]-(5)-[_statusLabel]|");
    }
    void layOut(double width, double height) {
        root->setFrame({{3, 30}, {width, height}});
        root->setNeedsLayout();
        root->layoutIfNeeded();
    }
    static void expectFrame(const View& view, const Rect& frame) {
        EXPECT_TRUE(std::abs(view.frame().origin.x - frame.origin.x) < 1e-6 &&
                    std::abs(view.frame().origin.y - frame.origin.y) < 1e-6 &&
                    std::abs(view.frame().size.width - frame.size.width) < 1e-6 &&
                    std::abs(view.frame().size.height - frame.size.height) < 1e-6)
            << view.frame() << " instead of " << frame;
    }
};

TEST_F(ConstraintLayoutTest, AStatusStandsBetweenItsMarginsUnderTheBar) {
    addStatusLayout();

    layOut(320, 23.4);

    expectFrame(*bar, {{50, 0}, {220, 4}});
    expectFrame(*label, {{20, 9}, {280, 14.4}});
    EXPECT_TRUE(lines.empty());
}

TEST_F(ConstraintLayoutTest, AStatusThatHasRoomTakesIt) {
    addStatusLayout();

    layOut(1024, 60);

    expectFrame(*bar, {{50, 0}, {924, 4}});
    expectFrame(*label, {{20, 9}, {984, 51}});
}

TEST_F(ConstraintLayoutTest, ALongStatusIsCutOffBeforeTheBarIsPressed) {
    addStatusLayout();
    label->setText(std::string(100, 'x'));

    layOut(320, 23.4);

    // 46 characters to a line: three lines, 43.2 points.
    EXPECT_NEAR(label->heightForWidth(280), 43.2, 1e-6);
    expectFrame(*bar, {{50, 0}, {220, 4}});
    expectFrame(*label, {{20, 9}, {280, 14.4}});
    EXPECT_TRUE(lines.empty());
}

TEST_F(ConstraintLayoutTest, TheContentThatResistsMoreKeepsItsHeight) {
    addStatusLayout();
    label->setText(std::string(100, 'x'));
    label->setContentCompressionResistancePriorityForAxis(800, LayoutAxis::vertical);

    layOut(320, 50);

    expectFrame(*bar, {{50, 0}, {220, 1.8}});
    expectFrame(*label, {{20, 6.8}, {280, 43.2}});
}

TEST_F(ConstraintLayoutTest, ANarrowStatusHasABarWithoutWidthAndSaysSo) {
    addStatusLayout();

    layOut(80, 60);

    expectFrame(*bar, {{50, 0}, {0, 4}});
    expectFrame(*label, {{20, 9}, {40, 51}});
    EXPECT_EQ(lines, (std::vector<std::pair<int, std::string>>{
                         {LOG_WARNING,
                          "a layout breaks 1 required constraints, the first is the view's right "
                          "== subview 0's right + 50"}}));
}

TEST_F(ConstraintLayoutTest, AStatusOfNoSizeIsLaidOut) {
    addStatusLayout();

    layOut(0, 0);

    expectFrame(*bar, {{50, 0}, {0, 0}});
    expectFrame(*label, {{20, 5}, {0, 0}});
    EXPECT_EQ(lines.size(), 1U);
}

TEST_F(ConstraintLayoutTest, ASizeThatIsNoneCountsAsNothing) {
    addStatusLayout();

    layOut(-10, NAN);

    expectFrame(*bar, {{50, 0}, {0, 0}});
    expectFrame(*label, {{20, 5}, {0, 0}});
}

TEST_F(ConstraintLayoutTest, AWrappingLabelGetsTheHeightForTheWidthFound) {
    add("H:|-[_statusLabel]-|");
    add("V:|-[_statusLabel]");

    layOut(64, 200);

    // 24 points hold 4 of 10 characters.
    expectFrame(*label, {{20, 20}, {24, 43.2}});
}

TEST_F(ConstraintLayoutTest, WhatNothingIsSaidOfHasItsContentsSizeAtTheOrigin) {
    layOut(100, 100);

    expectFrame(*bar, {{0, 0}, {0, 4}});
    expectFrame(*label, {{0, 0}, {60, 14.4}});
}

TEST_F(ConstraintLayoutTest, AViewThatStandsAsItIsIsNotMovedButCanBeLeanedOn) {
    bar->setTranslatesAutoresizingMaskIntoConstraints(true);
    bar->setFrame({{10, 20}, {30, 40}});
    add("H:[_progressBar]-[_statusLabel]");
    add("V:[_progressBar][_statusLabel(_progressBar)]");

    layOut(100, 100);

    EXPECT_EQ(bar->frame(), (Rect{{10, 20}, {30, 40}}));
    expectFrame(*label, {{48, 60}, {60, 40}});
}

TEST_F(ConstraintLayoutTest, AHiddenViewKeepsItsRoom) {
    addStatusLayout();
    bar->setHidden(true);

    layOut(320, 60);

    expectFrame(*label, {{20, 9}, {280, 51}});
}

TEST_F(ConstraintLayoutTest, TheHigherPriorityWinsWhateverTheOrder) {
    add("H:|-(10@300)-[_progressBar(100@400)]");
    add("H:|-(30@600)-[_progressBar(70@500)]");

    layOut(320, 60);

    expectFrame(*bar, {{30, 0}, {70, 4}});
    EXPECT_TRUE(lines.empty());
}

TEST_F(ConstraintLayoutTest, AmongEqualsTheFirstWins) {
    add("H:[_progressBar(100@400)]");
    add("H:[_progressBar(70@400)]");

    layOut(320, 60);

    expectFrame(*bar, {{0, 0}, {100, 4}});
}

TEST_F(ConstraintLayoutTest, RequiredContradictionsGiveWayInTheirOrderInOneLine) {
    add("H:|-10-[_progressBar(100)]");
    add("H:|-20-[_progressBar(>=200)]");

    layOut(320, 60);

    expectFrame(*bar, {{10, 0}, {100, 4}});
    EXPECT_EQ(lines, (std::vector<std::pair<int, std::string>>{
                         {LOG_WARNING,
                          "a layout breaks 2 required constraints, the first is subview 0's width "
                          ">= 200"}}));
}

TEST_F(ConstraintLayoutTest, WhatCannotBeMetComesAsNearAsItCan) {
    add("H:|-(>=0)-[_statusLabel]-(>=0)-|");
    add("H:|-(5@1)-[_progressBar(<=50)]");
    add("H:[_progressBar(80@900)]");

    layOut(32, 60);

    expectFrame(*label, {{0, 0}, {32, 28.8}});
    expectFrame(*bar, {{5, 0}, {50, 4}});
    EXPECT_TRUE(lines.empty());
}

TEST_F(ConstraintLayoutTest, InequalitiesShareARow) {
    add("H:|-(>=10)-[_progressBar(>=40)]-(>=8)-[_statusLabel]-(>=10,10@100)-|");

    layOut(200, 60);

    // The label keeps 60 points at the far edge, the bar its least width at the near one.
    expectFrame(*label, {{130, 0}, {60, 14.4}});
    expectFrame(*bar, {{10, 0}, {40, 4}});
}

TEST_F(ConstraintLayoutTest, EqualWidthsDivideTheRow) {
    add("H:|-[_progressBar]-[_statusLabel(_progressBar)]-|");

    layOut(148, 60);

    expectFrame(*bar, {{20, 0}, {50, 4}});
    expectFrame(*label, {{78, 0}, {50, 28.8}});
}

TEST_F(ConstraintLayoutTest, AnotherTextIsLaidOutInTheNextPass) {
    add("H:|[_statusLabel]");
    layOut(320, 60);

    label->setText("0123");
    root->layoutIfNeeded();

    expectFrame(*label, {{0, 0}, {24, 14.4}});
}

} // namespace
} // namespace nimbra
