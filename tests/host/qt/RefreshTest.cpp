#include "host/core/PaneSession.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/WindowFixture.h"

#include <QTest>
#include <string_view>

namespace nimbra::window {

namespace {

/// A page whose documents cannot be read once it is open, which is logged each time it tries.
class Refresh : public WindowTest {
protected:
    ~Refresh() override {
        if (_isWatched) {
            static_cast<void>(testing::internal::GetCapturedStderr());
        }
    }
    void openWatchedPane() {
        makeUsedDevice();
        ASSERT_NO_FATAL_FAILURE(openPane());
        test::writeTestFile(root() / "var/lib/nimbra/documents.json", "[");
        settle();
        testing::internal::CaptureStderr();
        _isWatched = true;
    }
    /// How often the documents have been fetched anew since the last call.
    [[nodiscard]] int takeRefreshes() {
        settle();
        EXPECT_FALSE(session().isRefreshing());
        const std::string log = testing::internal::GetCapturedStderr();
        testing::internal::CaptureStderr();
        constexpr std::string_view file = "documents.json";
        int count = 0;
        for (auto found = log.find(file); found != std::string::npos;
             found = log.find(file, found + 1)) {
            ++count;
        }
        return count;
    }
    /// Drags the list `down` points with the mouse, and lets it go.
    void drag(int down) {
        const QPoint begin(window().width() / 2, 200);
        QTest::mousePress(&window(), Qt::LeftButton, Qt::NoModifier, begin);
        constexpr int pieces = 10;
        for (int piece = 1; piece <= pieces; ++piece) {
            QTest::mouseMove(&window(), begin + QPoint(0, down * piece / pieces));
        }
        QTest::mouseRelease(&window(), Qt::LeftButton, Qt::NoModifier, begin + QPoint(0, down));
    }

private:
    bool _isWatched = false;
};

} // namespace

TEST_F(Refresh, KeysAskThePageToFetchAnew) {
    openWatchedPane();

    key(Qt::Key_F5);
    EXPECT_EQ(takeRefreshes(), 1);
    key(Qt::Key_R, Qt::ControlModifier);
    EXPECT_EQ(takeRefreshes(), 1);
    key(Qt::Key_R);
    EXPECT_EQ(takeRefreshes(), 0);
}

TEST_F(Refresh, TheButtonDoesForTheMouseAndForScreenReaders) {
    openWatchedPane();

    click(control(QStringLiteral("Refresh")));
    EXPECT_EQ(takeRefreshes(), 1);
    act(control(QStringLiteral("Refresh")), QAccessibleActionInterface::pressAction());
    EXPECT_EQ(takeRefreshes(), 1);
}

TEST_F(Refresh, ALongPullDoesAndAShortOneDoesNot) {
    openWatchedPane();

    drag(30);
    EXPECT_EQ(takeRefreshes(), 0);
    drag(300);
    EXPECT_EQ(takeRefreshes(), 1);
    // A pull is no click: no row has been used.
    EXPECT_TRUE(row("notes")->property("isOn").toBool());
    EXPECT_TRUE(row("Nimbra Drive")->property("isOn").toBool());
}

TEST_F(Refresh, ThePageOfTheAccountHasNothingToFetch) {
    makeUsedDevice();
    start();

    EXPECT_EQ(control(QStringLiteral("Refresh")), nullptr);
    key(Qt::Key_F5);
    EXPECT_FALSE(pane().isOpen());
}

TEST_F(Refresh, UnderAQuestionNothingIsFetched) {
    openWatchedPane();
    const auto alert = AlertController::alertControllerWithTitleMessagePreferredStyle(
        "Sure?", {}, AlertControllerStyle::alert);
    alert->addAction({.title = "Yes"});
    session().presentations().present(alert);
    _host->pump().run();

    key(Qt::Key_F5);

    EXPECT_EQ(takeRefreshes(), 0);
    EXPECT_TRUE(session().presentations().alert());
}

} // namespace nimbra::window
