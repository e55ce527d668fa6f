#include "host/core/PaneSession.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/WindowFixture.h"

namespace nimbra::window {

namespace {

/// Pages that slide, in real time; what they come to is waited for, and nothing is measured.
class Slide : public WindowTest {
protected:
    void openSlidingPane() {
        makeSampleDevice();
        Arguments sliding = arguments();
        sliding.appearance.reducedMotion = false;
        ASSERT_NO_FATAL_FAILURE(openPane(sliding));
        ASSERT_TRUE(waitUntilRests("panePage", 0));
    }
    /// A page that has been made; null where there is none.
    [[nodiscard]] QQuickItem* page(const char* name) {
        for (QQuickItem* const item : shownItems(window().contentItem())) {
            if (item->objectName() == QLatin1String(name)) {
                return item;
            }
        }
        return nullptr;
    }
    [[nodiscard]] qreal placeOf(const char* name) { return page(name)->mapToScene({}).x(); }
    [[nodiscard]] bool waitUntilRests(const char* name, qreal place) {
        return waitFor([&] { return page(name) != nullptr && placeOf(name) == place; });
    }
    /// Shows a window that slides, for the steps of a scenario.
    void startSlidingScenario(const std::string& steps) {
        test::writeTestFile(place("scenario.json"),
                            R"({"device": {"accounts": [{
                                  "identifier": "primary", "primary": true, "usesStratafile": true,
                                  "enabled": ["kAccountDataclassTidewater"]}]},
                                "steps": )" +
                                steps + '}');
        Arguments sliding = arguments();
        sliding.root.reset();
        sliding.scenario = place("scenario.json");
        sliding.appearance.reducedMotion = false;
        start(sliding);
    }
    /// The next of the steps, and what follows from it; no frame has been drawn since.
    void performNext() {
        const auto done = _host->player()->performNext();
        ASSERT_TRUE(done) << done.error().reason;
        _host->pump().run();
    }
    /// What share of its ground the bar of the sync covers; negative while there is no bar.
    [[nodiscard]] qreal coveredShare() {
        for (QAccessibleInterface* const found : accessibles()) {
            if (found->role() == QAccessible::ProgressBar) {
                const auto* const ground = qobject_cast<QQuickItem*>(found->object());
                return ground->childItems().constFirst()->width() / ground->width();
            }
        }
        return -1;
    }
    [[nodiscard]] bool waitUntilGone(const char* name) {
        return waitFor([&] { return page(name) == nullptr; });
    }
};

} // namespace

TEST_F(Slide, ThePaneSlidesOutAsItWasOverThePageBelow) {
    openSlidingPane();
    const int rows = pane().rows()->rowCount();
    const QVariant status = pane().property("statusText");
    ASSERT_NE(status.toString(), QString());

    // When the user goes back
    pane().goBack();

    // Then the pane has been closed, and its page is still seen with all that was on it
    EXPECT_FALSE(session().isPaneOpen());
    EXPECT_FALSE(pane().isOpen());
    EXPECT_EQ(pane().rows()->rowCount(), rows);
    EXPECT_EQ(pane().property("statusText"), status);
    ASSERT_NE(page("panePage"), nullptr);
    EXPECT_FALSE(page("panePage")->isEnabled());
    ASSERT_NE(page("accountPage"), nullptr);
    EXPECT_TRUE(page("accountPage")->isEnabled());

    // It moves to where it came from
    ASSERT_TRUE(waitFor([this] { return page("panePage") == nullptr || placeOf("panePage") > 0; }));
    // and is gone then, with its rows
    ASSERT_TRUE(waitUntilGone("panePage"));
    EXPECT_EQ(pane().rows()->rowCount(), 0);
    EXPECT_EQ(pane().property("statusText").toString(), QString());
    settle();
    EXPECT_TRUE(row(labels().front())->hasActiveFocus());
}

TEST_F(Slide, NobodyAsksTheRowsOfAPaneThatHasBeenClosed) {
    openSlidingPane();
    pane().goBack();
    ShownRows& rows = *pane().rows();
    ASSERT_GT(rows.rowCount(), 0);

    // When those that nobody has seen yet are looked at, and used
    for (int row = 0; row < rows.rowCount(); ++row) {
        EXPECT_TRUE(rows.index(row, 0).data(RowsModel::KindRole).isValid());
    }
    const int notes = rows.indexOf(QStringLiteral("com.example.notes"));
    const QVariant before = rows.index(notes, 0).data(RowsModel::IsOnRole);
    rows.set(notes, !before.toBool());
    rows.tap(rows.indexOf(QStringLiteral("CLOUD_DRIVE_DIAGNOSE")));
    rows.rows().readAnew();

    // Then nothing comes of it
    EXPECT_EQ(rows.index(notes, 0).data(RowsModel::IsOnRole), before);
    settle();
    EXPECT_FALSE(pane().isOpen());
    EXPECT_FALSE(session().activity());
}

TEST_F(Slide, APaneThatIsOpenedWhileItLeavesComesBackAsNew) {
    openSlidingPane();
    const auto before = labels();
    pane().rows()->setSearch(QStringLiteral("notes"));
    pane().goBack();
    ASSERT_NE(page("panePage"), nullptr);

    pane().open();

    EXPECT_TRUE(pane().isOpen());
    ASSERT_TRUE(waitUntilRests("panePage", 0));
    settle();
    EXPECT_EQ(labels(), before);
    EXPECT_TRUE(page("panePage")->isEnabled());
    click(row("com.example.notes"));
    EXPECT_FALSE(row("com.example.notes")->property("isOn").toBool());
}

TEST_F(Slide, APaneThatIsOpenedWhileItLeavesBeginsAtItsBeginning) {
    openSlidingPane();
    list()->forceActiveFocus();
    key(Qt::Key_End);
    ASSERT_FALSE(list()->property("atYBeginning").toBool());
    pane().goBack();
    ASSERT_NE(page("panePage"), nullptr);

    pane().open();

    ASSERT_TRUE(waitUntilRests("panePage", 0));
    settle();
    EXPECT_TRUE(list()->property("atYBeginning").toBool());
    EXPECT_TRUE(row("Nimbra Drive")->hasActiveFocus());
}

TEST_F(Slide, ADetailPageSlidesOutOverThePane) {
    openSlidingPane();
    click(row("Look Me Up by Email"));
    ASSERT_TRUE(waitUntilRests("detailPage", 0));
    const int rows = pane().detailRows()->rowCount();
    ASSERT_GT(rows, 0);

    pane().goBack();

    EXPECT_FALSE(pane().property("isDetailOpen").toBool());
    EXPECT_EQ(pane().detailRows()->rowCount(), rows);
    ASSERT_NE(page("detailPage"), nullptr);
    EXPECT_FALSE(page("detailPage")->isEnabled());
    ASSERT_NE(page("panePage"), nullptr);
    EXPECT_TRUE(page("panePage")->isEnabled());
    ASSERT_TRUE(waitUntilGone("detailPage"));
    EXPECT_EQ(pane().detailRows()->rowCount(), 0);
    EXPECT_TRUE(pane().isOpen());
    EXPECT_GT(pane().rows()->rowCount(), 0);
    settle();
    EXPECT_TRUE(row("Look Me Up by Email")->hasActiveFocus());
}

TEST_F(Slide, WhoGoesBackTwiceSeesBothPagesToTheirEnds) {
    openSlidingPane();
    click(row("Look Me Up by Email"));
    ASSERT_TRUE(waitUntilRests("detailPage", 0));
    pane().goBack();
    ASSERT_TRUE(waitFor([this] { return placeOf("detailPage") > 0; }));

    const QQuickItem* const place = page("panePage")->parentItem();

    // When the pane follows before the first page has left
    pane().goBack();

    // Then its page is gone only when it has come to where it goes
    ASSERT_TRUE(waitUntilGone("panePage"));
    EXPECT_EQ(place->x(), window().width());
    EXPECT_EQ(page("detailPage"), nullptr);
}

TEST_F(Slide, AWindowMayCloseWhileAPageLeaves) {
    openSlidingPane();
    pane().goBack();
    ASSERT_NE(page("panePage"), nullptr);

    _host.reset();
}

TEST_F(Slide, TheBarMovesToWhereTheSyncIs) {
    // Given a bar that shows how far a sync is
    startSlidingScenario(R"([{"do": "open"}, {"do": "appear"},
        {"do": "publishProgress", "id": "sync", "fraction": 0.25},
        {"do": "updateProgress", "id": "sync", "fraction": 0.75}])");
    for (int step = 0; step < 3; ++step) {
        ASSERT_NO_FATAL_FAILURE(performNext());
        settle();
    }
    ASSERT_TRUE(waitUntilRests("panePage", 0));
    key(Qt::Key_End);
    ASSERT_TRUE(waitFor([this] { return coveredShare() == 0.25; }));

    // When the sync goes on
    ASSERT_NO_FATAL_FAILURE(performNext());

    // Then the bar sets out from where it was
    EXPECT_EQ(coveredShare(), 0.25);
    EXPECT_TRUE(waitFor([this] { return coveredShare() == 0.75; }));
}

TEST_F(Slide, WhereMotionIsReducedAPageIsGoneAtOnce) {
    makeSampleDevice();
    openPane();

    pane().goBack();

    EXPECT_EQ(pane().rows()->rowCount(), 0);
    EXPECT_EQ(page("panePage"), nullptr);
}

} // namespace nimbra::window
