#include "tests/host/qt/SilentBus.h"
#include "tests/host/qt/WindowFixture.h"

#include <algorithm>

namespace nimbra::window {

namespace {

class Start : public WindowTest {
protected:
    /// How many sheets the window has, shown or not.
    [[nodiscard]] std::ptrdiff_t sheets() {
        const auto items = window().findChildren<QQuickItem*>();
        return std::ranges::count_if(
            items, [](const QQuickItem* item) { return item->property("sheetHeight").isValid(); });
    }
};

} // namespace

TEST_F(Start, ARowIsInItsPlaceBeforeTheWindowIsShown) {
    makeSampleDevice();
    Arguments toRow = arguments();
    toRow.row = "Nimbra Drive";
    auto made = SettingsHost::make(toRow);
    ASSERT_TRUE(made) << made.error();
    _host = std::move(*made);

    const auto shown = _host->showRow(*toRow.row);

    ASSERT_TRUE(shown) << shown.error();
    auto* const page = window().findChild<QQuickItem*>(QStringLiteral("panePage"));
    ASSERT_NE(page, nullptr);
    EXPECT_EQ(page->mapToScene({}), QPointF(0, 0));
    auto* const rows = page->findChild<QQuickItem*>(QStringLiteral("rows"));
    ASSERT_NE(rows, nullptr);
    const auto* const row = rows->property("currentItem").value<QQuickItem*>();
    ASSERT_NE(row, nullptr);
    EXPECT_EQ(row->property("title").toString(), QStringLiteral("Nimbra Drive"));
    const qreal place = row->mapToItem(rows, QPointF()).y();
    EXPECT_GE(place, 0);
    EXPECT_LE(place + row->height(), rows->height());
}

TEST_F(Start, ThePageBelowIsMadeWhenTheUserComesBackToIt) {
    makeSampleDevice();
    Arguments toRow = arguments();
    toRow.row = "Nimbra Drive";
    start(toRow);
    ASSERT_TRUE(pane().isOpen());
    EXPECT_EQ(window().findChild<QQuickItem*>(QStringLiteral("accountPage")), nullptr);

    pane().goBack();
    settle();

    EXPECT_FALSE(pane().isOpen());
    EXPECT_EQ(labels(), std::vector<std::string>{"Nimbra Drive"});
    EXPECT_TRUE(list()->hasActiveFocus() || focusedName() == "Nimbra Drive");
}

TEST_F(Start, ASheetIsMadeWhenItIsShown) {
    makeSampleDevice();
    openPane();
    ASSERT_EQ(sheets(), 0);

    click(row("Collect Diagnostics"));
    ASSERT_TRUE(waitFor([this] { return named("save") != nullptr; }));

    EXPECT_GT(sheets(), 0);
    EXPECT_NE(control(QStringLiteral("Copy Path")), nullptr);
}

TEST_F(Start, ASessionBusThatNeverAnswersHoldsNothingUp) {
    test::SilentBus bus;
    setEnvironment("DBUS_SESSION_BUS_ADDRESS", bus.address());
    makeUsedDevice();
    Arguments following = arguments();
    following.appearance.dark.reset();

    start(following);
    bus.take();
    click(row(labels().front()));

    EXPECT_TRUE(pane().isOpen());
    EXPECT_TRUE(bus.isWaitedFor());
    _host.reset();
    bus.awaitLeaving();
}

} // namespace nimbra::window
