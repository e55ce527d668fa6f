#include "host/core/PaneSession.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/Gate.h"
#include "tests/host/qt/WindowFixture.h"

#include <QTest>
#include <algorithm>
#include <ostream>

namespace nimbra::window {

namespace {

struct Look {
    int width;
    int percent;
    const char* locale;

    friend void PrintTo(const Look& look, std::ostream* out) {
        *out << look.width << " points, " << look.percent << " %, " << look.locale;
    }
};

/// What must hold on every screen, whatever is on it.
class EveryScreen : public WindowTest, public testing::WithParamInterface<Look> {
protected:
    [[nodiscard]] Arguments look() const {
        Arguments looked = arguments();
        looked.size = {GetParam().width, 700};
        looked.appearance.textScale = GetParam().percent / 100.0;
        looked.locale = GetParam().locale;
        return looked;
    }
    /// All rows of the page on top, one after the other.
    void expectAllRowsInOrder(const char* screen) {
        expectInOrder(screen);
        const auto all = labels();
        ASSERT_FALSE(all.empty());
        for (const std::string& label : all) {
            ASSERT_NE(row(label), nullptr) << label;
            expectInOrder(screen);
        }
    }
    void expectInOrder(const char* screen) {
        const testing::ScopedTrace place(__FILE__, __LINE__, screen);
        int controls = 0;
        for (QAccessibleInterface* const found : accessibles()) {
            controls += expectUsable(found) ? 1 : 0;
        }
        // An empty screen would pass all of this.
        EXPECT_GT(controls, 0);
        expectApart(list());
        for (QQuickItem* const item : shownItems(window().contentItem())) {
            if (item->inherits("QQuickText") && !item->property("text").toString().isEmpty()) {
                expectWhole(item);
            }
        }
    }

private:
    /// Whether `found` is a control, which then has what a control needs.
    static bool expectUsable(QAccessibleInterface* found) {
        auto* const item = qobject_cast<QQuickItem*>(found->object());
        // Qt calls every text focusable, whatever its page says.
        const bool isText = found->role() == QAccessible::StaticText;
        if (item == nullptr ||
            !(item->activeFocusOnTab() || (found->state().focusable && !isText))) {
            return false;
        }
        const std::string name = found->text(QAccessible::Name).toStdString();
        constexpr qreal finger = 44;
        EXPECT_NE(name, "") << item->objectName().toStdString();
        EXPECT_TRUE(found->role() != QAccessible::NoRole && found->role() != QAccessible::Client)
            << name;
        EXPECT_GE(item->width(), finger) << name;
        EXPECT_GE(item->height(), finger) << name;
        return true;
    }
    /// No text of a list lies over another one.
    static void expectApart(QQuickItem* list) {
        std::vector<QQuickItem*> texts;
        for (QQuickItem* const item : shownItems(list)) {
            if (item->inherits("QQuickText") && !item->property("text").toString().isEmpty()) {
                texts.push_back(item);
            }
        }
        const auto paintedFrame = [](const QQuickItem* text) {
            constexpr qreal hair = 1;
            const QSizeF size(text->property("paintedWidth").toReal(),
                              text->property("paintedHeight").toReal());
            return text->mapRectToScene(QRectF(QPointF(), size)).adjusted(hair, hair, -hair, -hair);
        };
        for (auto text = texts.begin(); text != texts.end(); ++text) {
            for (auto other = text + 1; other != texts.end(); ++other) {
                EXPECT_FALSE(paintedFrame(*text).intersects(paintedFrame(*other)))
                    << (*text)->property("text").toString().toStdString() << " and "
                    << (*other)->property("text").toString().toStdString();
            }
        }
    }
    void expectWhole(QQuickItem* text) {
        constexpr qreal hair = 1;
        const std::string told = text->property("text").toString().left(60).toStdString();
        EXPECT_FALSE(text->property("truncated").toBool()) << told;
        EXPECT_LE(text->property("paintedWidth").toReal(), text->width() + hair) << told;
        EXPECT_LE(text->property("paintedHeight").toReal(), text->height() + hair) << told;
        const QRectF frame = text->mapRectToItem(text->parentItem(), text->boundingRect());
        const QRectF room = text->parentItem()->boundingRect().adjusted(-hair, -hair, hair, hair);
        EXPECT_TRUE(room.contains(frame))
            << told << ": " << frame.x() << ' ' << frame.y() << ' ' << frame.width() << ' '
            << frame.height() << " of " << room.width() << ' ' << room.height();
        const QRectF seen = text->mapRectToScene(text->boundingRect());
        EXPECT_GE(seen.left(), -hair) << told;
        EXPECT_LE(seen.right(), window().width() + hair) << told;
    }
};

} // namespace

TEST_P(EveryScreen, TheAccountAndThePaneAndThePageBehindALink) {
    makeSampleDevice();
    start(look());
    expectAllRowsInOrder("account");
    click(row(labels().front()));
    ASSERT_TRUE(pane().isOpen());
    expectAllRowsInOrder("pane");
    click(row(labels().at(1)));
    ASSERT_NE(session().detailPage().page(), nullptr);
    expectAllRowsInOrder("detail");
}

TEST_P(EveryScreen, TheUpgradeAndItsQuestionAndItsFailure) {
    makeDevice(
        R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": false}],
        "deviceList": {"needUpgrade": ["Work Phone"], "incompatible": ["Attic Tablet"]},
        "faults": {"save": [{"domain": "accounts", "code": 13, "description": "full"}]}})");
    openPane(look());
    key(Qt::Key_Return);
    ASSERT_NE(session().presentations().screen(), nullptr);
    expectInOrder("upgrade");
    key(Qt::Key_Tab);
    key(Qt::Key_Return);
    ASSERT_TRUE(session().presentations().alert());
    expectInOrder("question");
    key(Qt::Key_Tab);
    key(Qt::Key_Return);
    ASSERT_TRUE(session().presentations().alert());
    ASSERT_TRUE(session().presentations().alert()->isOfAccount);
    expectInOrder("failure");
}

TEST_P(EveryScreen, BusyAndTheShareCardAndItsProblem) {
    makeUsedDevice(R"(, "preferences": {"com.vantrel.marrow": {"log.level": 7}})");
    const Gate gate(place("gate"));
    const auto tool = root() / "usr/bin/mrctl";
    test::writeTestFile(tool, "#!/bin/sh\n" + gate.command() + "\necho collected > \"$3\"\n");
    std::filesystem::permissions(tool, std::filesystem::perms::all);
    openPane(look());
    ASSERT_NE(row("CLOUD_DRIVE_DIAGNOSE"), nullptr);
    key(Qt::Key_End);

    QTest::keyClick(&window(), Qt::Key_Return);
    ASSERT_TRUE(waitFor([this] { return session().activity().isPresent(); }));
    static_cast<void>(window().grabWindow());
    EXPECT_TRUE(isSaid(pane().property("activity").toString()));
    expectInOrder("busy");
    gate.open();
    settle();
    ASSERT_NE(session().presentations().shareSheet(), nullptr);
    expectInOrder("share");
    _host->sharing().save(QString::fromStdString((root() / "none/here").string()));
    settle();
    ASSERT_NE(session().presentations().shareSheet(), nullptr);
    expectInOrder("problem");
}

INSTANTIATE_TEST_SUITE_P(Looks, EveryScreen,
                         testing::Values(Look{390, 100, "en-US"}, Look{320, 100, "en-US"},
                                         Look{900, 100, "en-US"}, Look{320, 200, "en-US"},
                                         Look{900, 200, "en-US"}, Look{320, 200, "de-DE"},
                                         Look{390, 100, "ja-JP"}, Look{320, 200, "ar"}));

} // namespace nimbra::window
