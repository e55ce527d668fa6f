#include "host/core/PaneSession.h"
#include "tests/host/qt/WindowFixture.h"

namespace nimbra::window {

namespace {

constexpr const char* notes = "com.example.notes";

/// Which rows of the pane have a cell in the table: those that the user sees.
class ShownCells : public WindowTest {
protected:
    [[nodiscard]] bool hasCell(const std::string& label) {
        const auto found = session().row(label);
        EXPECT_TRUE(found) << label;
        const auto* const page = found ? (*found)->target() : nullptr;
        const auto place = page != nullptr ? page->indexPathForSpecifier(*found) : std::nullopt;
        EXPECT_TRUE(place) << label;
        return place && page->table()->cellForRowAtIndexPath(*place) != nullptr;
    }
};

} // namespace

TEST_F(ShownCells, ARowHasOneWhileAPartOfItIsInSight) {
    makeSampleDevice();
    openPane();
    QQuickItem* const found = row(notes);
    ASSERT_TRUE(hasCell(notes));
    const auto scrollTo = [this](qreal y) {
        list()->setProperty("contentY", y);
        settle();
    };
    const qreal above = found->y() + found->property("cardTop").toReal() - list()->height();
    const qreal below = found->y() + found->property("cardBottom").toReal();

    scrollTo(below - 1);
    EXPECT_TRUE(hasCell(notes));
    scrollTo(below);
    EXPECT_FALSE(hasCell(notes));
    scrollTo(above + 1);
    EXPECT_TRUE(hasCell(notes));
    scrollTo(above);
    EXPECT_FALSE(hasCell(notes));
}

TEST_F(ShownCells, ARowThatTheSearchLeavesOutHasNone) {
    makeSampleDevice();
    openPane();
    ASSERT_NE(row(notes), nullptr);
    ASSERT_TRUE(hasCell(notes));

    pane().rows()->setSearch(QStringLiteral("scanner 10"));

    // At once, before the list is drawn again.
    EXPECT_TRUE(hasCell("com.example.scanner-10"));
    EXPECT_FALSE(hasCell(notes));
    pane().rows()->setSearch({});
    ASSERT_NE(row(notes), nullptr);
    EXPECT_TRUE(hasCell(notes));
}

TEST_F(ShownCells, UnderAnotherPageThereAreNone) {
    makeSampleDevice();
    openPane();
    const std::string link = "Look Me Up by Email";
    ASSERT_NE(row(link), nullptr);
    ASSERT_TRUE(hasCell(link));

    click(row(link));
    ASSERT_TRUE(pane().property("isDetailOpen").toBool());
    EXPECT_FALSE(hasCell(link));

    key(Qt::Key_Escape);
    EXPECT_TRUE(hasCell(link));
}

} // namespace nimbra::window
