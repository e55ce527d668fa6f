#include "tests/host/qt/WindowFixture.h"

#include <algorithm>
#include <ostream>

namespace nimbra::window {

namespace {

struct Room {
    int percent;
    QSize size;
    const char* locale;

    friend void PrintTo(const Room& room, std::ostream* out) {
        *out << room.percent << " %, " << room.size.width() << "x" << room.size.height() << ", "
             << room.locale;
    }
};

/// Where a row comes to stand that the user is led to, in windows of all sizes.
class LedToRow : public WindowTest, public testing::WithParamInterface<Room> {
protected:
    void openPaneOfRoom() {
        makeSampleDevice();
        Arguments looked = arguments();
        looked.size = GetParam().size;
        looked.appearance.textScale = GetParam().percent / 100.0;
        looked.locale = GetParam().locale;
        openPane(looked);
    }
    [[nodiscard]] QQuickItem* currentRow() {
        return list()->property("currentItem").value<QQuickItem*>();
    }
    /// The card of the row, from the upper edge of the list on.
    [[nodiscard]] QRectF cardOf(const QQuickItem* row) {
        const qreal top = row->property("cardTop").toReal();
        const qreal bottom = row->property("cardBottom").toReal();
        return row->mapRectToItem(list(), QRectF(0, top, row->width(), bottom - top));
    }
    [[nodiscard]] bool isAtAnEnd() {
        return list()->property("atYBeginning").toBool() || list()->property("atYEnd").toBool();
    }
    /// The whole card is in the list, or as much of it, from its top on, as there is room for.
    void expectInSight(const QRectF& card) {
        constexpr qreal hair = 1;
        EXPECT_GE(card.top(), 0);
        EXPECT_LE(std::min(card.height(), list()->height()), list()->height() - card.top() + hair);
    }
};

} // namespace

TEST_P(LedToRow, ItsCardIsSeenWithItsExplanationWhereThereIsRoom) {
    ASSERT_NO_FATAL_FAILURE(openPaneOfRoom());
    const auto all = labels();
    ASSERT_GT(all.size(), 12U);

    for (const std::string& label : all) {
        const testing::ScopedTrace place(__FILE__, __LINE__, label);
        ASSERT_TRUE(_host->showRow(label));
        settle();

        const QQuickItem* const row = currentRow();
        ASSERT_NE(row, nullptr);
        ASSERT_TRUE(row->hasActiveFocus());
        EXPECT_EQ(row->property("label").toString().toStdString(), label);
        const QRectF card = cardOf(row);
        ASSERT_GT(card.height(), 0);
        expectInSight(card);
        const QRectF whole = row->mapRectToItem(list(), row->boundingRect());
        if (whole.height() <= list()->height()) {
            EXPECT_GE(whole.top(), 0);
            EXPECT_LE(whole.bottom(), list()->height());
        } else if (!isAtAnEnd()) {
            // As much of the explanation as there is room for.
            EXPECT_NEAR(card.top(), 0, 1);
        }
    }
}

TEST_P(LedToRow, TheKeysBringItsCardIntoSightAsWell) {
    ASSERT_NO_FATAL_FAILURE(openPaneOfRoom());
    const std::size_t count = labels().size();
    key(Qt::Key_Home);

    for (const Qt::Key step : {Qt::Key_Down, Qt::Key_Up}) {
        for (std::size_t row = 0; row < count; ++row) {
            ASSERT_NE(currentRow(), nullptr);
            expectInSight(cardOf(currentRow()));
            key(step);
        }
    }
    EXPECT_EQ(focusedName(), "Nimbra Drive");
}

INSTANTIATE_TEST_SUITE_P(
    Rooms, LedToRow,
    testing::Values(Room{100, {390, 760}, "en-US"}, Room{100, {320, 480}, "en-US"},
                    Room{200, {320, 480}, "en-US"}, Room{200, {390, 640}, "de-DE"},
                    Room{300, {320, 480}, "en-US"}, Room{300, {320, 640}, "en-US"},
                    Room{300, {390, 844}, "fr-FR"}, Room{300, {320, 320}, "en-US"}));

} // namespace nimbra::window
