#include "platform/host/Specifier.h"
#include "platform/views/Table.h"
#include "tests/footer/FooterFixture.h"

#include <array>
#include <limits>

namespace nimbra::test {
namespace {

using Footer = FooterFixture;

TEST_F(Footer, ANewViewShowsFourBlanksAndNoBar) {
    EXPECT_EQ(text(), Text("    "));
    EXPECT_TRUE(isBarHidden());
    EXPECT_EQ(view->progressBar()->progress(), 0);
    EXPECT_EQ(view->progressBar()->style(), ProgressViewStyle::standard);
    EXPECT_FALSE(view->isSyncing());
    EXPECT_FALSE(isAutoUpdating());
    EXPECT_EQ(view->globalProgressSubscriber(), nullptr);
    EXPECT_EQ(view->lastSyncDateSubscriber(), nullptr);
    EXPECT_EQ(takeCalls(), Calls()) << "nothing is asked before the view is in a window";
}

TEST_F(Footer, TheTextIsGrayCentredCaptionOfAnyNumberOfLines) {
    const Label& label = *view->statusLabel();

    EXPECT_EQ(label.textColor(), Color::gray);
    EXPECT_EQ(label.textAlignment(), TextAlignment::center);
    EXPECT_EQ(label.numberOfLines(), 0);
    EXPECT_EQ(label.font(), platform.viewMetrics.preferredFontForTextStyle(FontTextStyleCaption1));
    EXPECT_EQ(label.contentCompressionResistancePriorityForAxis(LayoutAxis::vertical), 750);
}

TEST_F(Footer, TheBarStandsBeforeTheTextInTheTree) {
    ASSERT_EQ(view->subviews().size(), 2U);
    EXPECT_EQ(view->subviews()[0], view->progressBar());
    EXPECT_EQ(view->subviews()[1], view->statusLabel());
    EXPECT_FALSE(view->progressBar()->translatesAutoresizingMaskIntoConstraints());
    EXPECT_FALSE(view->statusLabel()->translatesAutoresizingMaskIntoConstraints());
}

TEST_F(Footer, TheConstraintsPlaceTheBarOverTheText) {
    view->setFrame({.origin = {}, .size = {320, view->intrinsicContentSize().height}});

    view->layoutIfNeeded();

    const double bar = platform.viewMetrics.progressBarHeight();
    EXPECT_EQ(view->progressBar()->frame(), (Rect{{50, 0}, {220, bar}}));
    const Rect& label = view->statusLabel()->frame();
    EXPECT_EQ(label.origin, (Point{20, bar + 5}));
    EXPECT_EQ(label.size.width, 280);
    EXPECT_DOUBLE_EQ(label.size.height, view->statusLabel()->lineHeight());
    EXPECT_EQ(platform.systemLog.lines, FakeSystemLog::Lines()) << "every format can be read";
}

TEST_F(Footer, TheHeightIsOneLineTheBarAndFive) {
    const double expected =
        view->statusLabel()->lineHeight() + platform.viewMetrics.progressBarHeight() + 5;

    EXPECT_EQ(view->intrinsicContentSize(), (Size{ViewNoIntrinsicMetric, expected}));
}

TEST_F(Footer, TheHeightIsTheSameInEveryWidthAndForSeveralLines) {
    const double expected =
        view->statusLabel()->lineHeight() + platform.viewMetrics.progressBarHeight() + 5;
    view->statusLabel()->setText("one\ntwo\nthree and a fourth that is too long for the width");
    const Table table(platform.services(), {}, TableStyle::grouped);

    for (const double width :
         {-1.0, 0.0, 10.0, 320.0, 1000.0, std::numeric_limits<double>::infinity()}) {
        EXPECT_EQ(view->preferredHeightForWidthInTableView(width, &table), expected) << width;
        EXPECT_EQ(view->preferredHeightForWidthInTableView(width, nullptr), expected) << width;
    }
}

TEST_F(Footer, WhoLooksIntoTheViewLearnsItsState) {
    storeAge(std::chrono::seconds(30));
    EXPECT_EQ(view->valueForKey(KeyPath("syncing")), RowValue(false));
    EXPECT_EQ(view->valueForKey(KeyPath("lastSyncAutoUpdate")), RowValue(false));
    EXPECT_EQ(view->valueForKey(KeyPath("subscribed")), RowValue(false));
    EXPECT_EQ(view->valueForKey(KeyPath("colour")), RowValue());

    view->moveToWindow(&window);
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));

    EXPECT_EQ(view->valueForKey(KeyPath("syncing")), RowValue(true));
    EXPECT_EQ(view->valueForKey(KeyPath("lastSyncAutoUpdate")), RowValue(true));
    EXPECT_EQ(view->valueForKey(KeyPath("subscribed")), RowValue(true));
    end();
}

TEST_F(Footer, AViewHasTheFrameThatItIsMadeWith) {
    const Rect frame{{1, 2}, {300, 40}};

    const auto made = RSPNimbraDriveProgressFooterView::initWithFrame(frame, platform.services());

    EXPECT_EQ(made->frame(), frame);
    platform.workQueues.timers().at(1)->cancel();
}

TEST_F(Footer, TheGroupDoesNotMatter) {
    const auto group = Specifier::groupSpecifierWithID("Whatever");

    const auto made =
        RSPNimbraDriveProgressFooterView::initWithSpecifier(*group, platform.services());

    EXPECT_EQ(made->frame(), Rect());
    EXPECT_EQ(made->statusLabel()->text(), Text("    "));
    platform.workQueues.timers().at(1)->cancel();
}

TEST_F(Footer, ARunningTimerIsCancelledWithTheView) {
    storeAge(std::chrono::seconds(30));
    view->moveToWindow(&window);
    ASSERT_TRUE(isAutoUpdating());
    const std::shared_ptr<FakeTimer> kept = platform.workQueues.timers().at(0);
    kept->calls.clear();

    // The handler, the registration and the subscription hold the view.
    kept->setEventHandler({});
    platform.progressReports.finish();
    platform.distributedNotificationCenter.registrations.clear();
    const std::weak_ptr<View> gone = view;
    view.reset();

    EXPECT_TRUE(gone.expired());
    EXPECT_EQ(kept->calls, Calls{"cancel"});
    EXPECT_EQ(platform.distributedNotificationCenter.removals, 0);
}

TEST_F(Footer, ASuspendedTimerIsNotCancelledWithTheView) {
    const std::shared_ptr<FakeTimer> kept = platform.workQueues.timers().at(0);

    kept->setEventHandler({});
    const std::weak_ptr<View> gone = view;
    view.reset();

    EXPECT_TRUE(gone.expired());
    EXPECT_EQ(kept->calls, Calls());
}

TEST_F(Footer, TheTimerHoldsTheView) {
    const std::weak_ptr<View> held = view;

    view.reset();

    EXPECT_FALSE(held.expired());
    timer().cancel();
    EXPECT_TRUE(held.expired());
}

} // namespace
} // namespace nimbra::test
