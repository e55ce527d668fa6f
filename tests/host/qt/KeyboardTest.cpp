#include "host/core/PaneSession.h"
#include "tests/host/qt/WindowFixture.h"

#include <algorithm>
#include <utility>

namespace nimbra::window {

namespace {

using Names = std::vector<std::string>;

class Keyboard : public WindowTest {
protected:
    /// Goes on with `by` until the focus is where it was, and gives back where it has been.
    Names walk(Qt::Key by) {
        Names names;
        const auto begin = focusedControl();
        constexpr std::size_t far = 100;
        do {
            names.push_back(focusedName());
            expectFocusIsVisible();
            key(by, by == Qt::Key_Backtab ? Qt::ShiftModifier : Qt::NoModifier);
        } while (focusedControl() != begin && names.size() < far);
        return names;
    }
    /// A list uses its items again for other rows.
    std::pair<QQuickItem*, QString> focusedControl() {
        QQuickItem* const focused = window().activeFocusItem();
        const QVariant label = focused == nullptr ? QVariant() : focused->property("label");
        return label.isValid() ? std::pair<QQuickItem*, QString>(nullptr, label.toString())
                               : std::pair<QQuickItem*, QString>(focused, QString());
    }
    /// The focus has a ring around it, and is not beyond the window.
    void expectFocusIsVisible() {
        QQuickItem* const focused = window().activeFocusItem();
        ASSERT_NE(focused, nullptr);
        const QRectF frame = focused->mapRectToScene(focused->boundingRect());
        EXPECT_TRUE(frame.intersects(QRectF(QPointF(), QSizeF(window().size())))) << focusedName();
        EXPECT_TRUE(hasRing(focused) || hasRing(focused->parentItem())) << focusedName();
    }
    /// Whether there is a border three points wide or wider at or about the item.
    static bool hasRing(QQuickItem* item) {
        return std::ranges::any_of(shownItems(item), [](const QQuickItem* part) {
            const QVariant border = part->property("border");
            const auto* const pen = qvariant_cast<QObject*>(border);
            return pen != nullptr && pen->property("width").toReal() >= 3 &&
                   part->property("color").isValid();
        });
    }
    static Names turned(Names names) {
        std::ranges::reverse(names);
        std::ranges::rotate(names, names.end() - 1);
        return names;
    }
};

} // namespace

TEST_F(Keyboard, TabVisitsEveryControlInTheOrderOfReadingAndBacktabTheSameWayBack) {
    makeUsedDevice(R"(, "preferences": {"com.vantrel.marrow": {"log.level": 7}})");
    openPane();
    ASSERT_EQ(focusedName(), "Nimbra Drive");

    const Names there = walk(Qt::Key_Tab);
    EXPECT_EQ(there, (Names{"Nimbra Drive", "Atlas", "Notes", "Use Cellular Data",
                            "Collect Diagnostics", "Back, Account", "Refresh"}));
    EXPECT_EQ(walk(Qt::Key_Backtab), turned(there));
}

TEST_F(Keyboard, TheSearchFieldIsOnTheWayToo) {
    makeSampleDevice();
    openPane();

    const Names there = walk(Qt::Key_Tab);

    EXPECT_EQ(there.front(), "Nimbra Drive");
    EXPECT_EQ(there.at(1), "Look Me Up by Email");
    EXPECT_EQ(Names(there.end() - 4, there.end()),
              (Names{"Collect Diagnostics", "Back, Account", "Refresh", "Search apps"}));
    // With each row once.
    EXPECT_EQ(there.size(), labels().size() + 3);
    EXPECT_EQ(walk(Qt::Key_Backtab), turned(there));
}

TEST_F(Keyboard, TheArrowsGoFromRowToRowAndStopAtTheEnds) {
    makeUsedDevice();
    openPane();

    key(Qt::Key_Up);
    EXPECT_EQ(focusedName(), "Nimbra Drive");
    Names names;
    for (std::size_t row = 0; row < labels().size() + 1; ++row) {
        names.push_back(focusedName());
        key(Qt::Key_Down);
    }
    EXPECT_EQ(names,
              (Names{"Nimbra Drive", "Atlas", "Notes", "Use Cellular Data", "Use Cellular Data"}));
    key(Qt::Key_Up);
    EXPECT_EQ(focusedName(), "Notes");
}

TEST_F(Keyboard, HomeEndAndThePagesLeapAndTheRowIsSeen) {
    makeSampleDevice();
    openPane();

    key(Qt::Key_End);
    EXPECT_EQ(focusedName(), "Collect Diagnostics");
    expectFocusIsVisible();
    key(Qt::Key_PageUp);
    EXPECT_NE(focusedName(), "Collect Diagnostics");
    EXPECT_NE(focusedName(), "Nimbra Drive");
    expectFocusIsVisible();
    key(Qt::Key_Home);
    EXPECT_EQ(focusedName(), "Nimbra Drive");
    expectFocusIsVisible();
    key(Qt::Key_PageDown);
    EXPECT_NE(focusedName(), "Nimbra Drive");
    expectFocusIsVisible();
}

TEST_F(Keyboard, APageCanBeUsedWithoutTheMouse) {
    makeUsedDevice();
    start();
    key(Qt::Key_Space);
    ASSERT_TRUE(pane().isOpen());
    key(Qt::Key_Down);
    ASSERT_EQ(focusedName(), "Atlas");

    key(Qt::Key_Space);

    EXPECT_TRUE(row("atlas")->property("isOn").toBool());
    key(Qt::Key_Left, Qt::AltModifier);
    EXPECT_FALSE(pane().isOpen());
}

TEST_F(Keyboard, TheFocusStaysInASheet) {
    makeDevice(
        R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": false}],
                   "deviceList": {}})");
    openPane();
    key(Qt::Key_Return);

    EXPECT_EQ(walk(Qt::Key_Tab), (Names{"Cancel", "Upgrade"}));
    key(Qt::Key_Tab);
    key(Qt::Key_Return);
    ASSERT_TRUE(session().presentations().alert());
    EXPECT_EQ(walk(Qt::Key_Tab), (Names{"Cancel", "Continue"}));
    EXPECT_EQ(walk(Qt::Key_Backtab), (Names{"Cancel", "Continue"}));
}

TEST_F(Keyboard, WhereTheFocusIsAScreenReaderIsTold) {
    makeUsedDevice();
    openPane();

    for (const std::string label : {"atlas", "notes"}) {
        key(Qt::Key_Down);
        int focused = 0;
        for (QAccessibleInterface* const found : accessibles()) {
            if (found->role() == QAccessible::CheckBox && found->state().focused) {
                ++focused;
                EXPECT_EQ(found->object(), row(label));
                EXPECT_TRUE(found->state().focusable);
            }
        }
        EXPECT_EQ(focused, 1) << label;
    }
}

TEST_F(Keyboard, TheFocusStaysOnTheSwitchThatIsFlipped) {
    makeSampleDevice();
    openPane();

    key(Qt::Key_Space);
    EXPECT_TRUE(row("Nimbra Drive")->hasActiveFocus());
    key(Qt::Key_Space);
    EXPECT_TRUE(row("Nimbra Drive")->hasActiveFocus());
    key(Qt::Key_End);
    key(Qt::Key_Up);
    ASSERT_EQ(focusedName(), "Use Cellular Data");
    key(Qt::Key_Space);
    EXPECT_EQ(focusedName(), "Use Cellular Data");
}

} // namespace nimbra::window
