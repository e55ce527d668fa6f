#include "host/core/PaneSession.h"
#include "tests/host/qt/WindowFixture.h"

namespace nimbra::window {

namespace {

class Search : public WindowTest {
protected:
    [[nodiscard]] QQuickItem* field() {
        return control(QStringLiteral("Search apps"), QAccessible::EditableText);
    }
    /// The applications that the page shows, by their names.
    [[nodiscard]] std::vector<std::string> applications() {
        const auto* const rows = pane().rows();
        std::vector<std::string> names;
        for (int row = 0; row < rows->rowCount(); ++row) {
            const QModelIndex index = rows->index(row, 0);
            if (!index.data(RowsModel::ApplicationRole).toString().isEmpty()) {
                names.push_back(index.data(RowsModel::TitleRole).toString().toStdString());
            }
        }
        return names;
    }
    void openAndSearchFor(const QString& text) {
        makeSampleDevice();
        ASSERT_NO_FATAL_FAILURE(openPane());
        key(Qt::Key_F, Qt::ControlModifier);
        ASSERT_EQ(focusedName(), "Search apps");
        type(text);
    }
};

} // namespace

TEST_F(Search, TypingNarrowsTheApplicationsAndNothingElse) {
    makeSampleDevice();
    openPane();
    const auto all = applications();
    const std::size_t rowsOfThePage = session().rows().size();
    ASSERT_GE(all.size(), 12U);
    click(field());

    type(QStringLiteral("sc"));
    EXPECT_EQ(applications(), (std::vector<std::string>{"Scanner 2", "Scanner 10"}));
    EXPECT_NE(row("Nimbra Drive"), nullptr);
    EXPECT_NE(row("CLOUD_DRIVE_DIAGNOSE"), nullptr);
    EXPECT_EQ(session().rows().size(), rowsOfThePage);
    type(QStringLiteral("anner 10"));
    EXPECT_EQ(applications(), (std::vector<std::string>{"Scanner 10"}));
    key(Qt::Key_Backspace);
    key(Qt::Key_Backspace);
    EXPECT_EQ(applications().size(), 2U);
}

TEST_F(Search, MarksAndCapitalsMakeNoDifference) {
    openAndSearchFor(QStringLiteral("ECR"));

    EXPECT_EQ(applications(), (std::vector<std::string>{"Écrivain"}));
}

TEST_F(Search, EscapeClearsAndTheNextOneGoesBack) {
    openAndSearchFor(QStringLiteral("notes"));
    ASSERT_EQ(applications().size(), 1U);

    key(Qt::Key_Escape);
    EXPECT_GE(applications().size(), 12U);
    EXPECT_EQ(focusedName(), "Search apps");
    EXPECT_TRUE(pane().isOpen());
    key(Qt::Key_Escape);
    EXPECT_FALSE(pane().isOpen());
}

TEST_F(Search, TheCrossClears) {
    openAndSearchFor(QStringLiteral("notes"));

    click(control(QStringLiteral("Clear search")));

    EXPECT_GE(applications().size(), 12U);
    EXPECT_EQ(focusedName(), "Search apps");
    EXPECT_EQ(control(QStringLiteral("Clear search")), nullptr);
}

TEST_F(Search, WhoFindsNothingIsToldSo) {
    openAndSearchFor(QStringLiteral("xyz"));

    EXPECT_TRUE(applications().empty());
    EXPECT_TRUE(isSaid(QStringLiteral("No apps found for “xyz”")));
    key(Qt::Key_Escape);
    EXPECT_FALSE(isSaid(QStringLiteral("No apps found for “xyz”")));
}

TEST_F(Search, AFoundRowIsUsedAsAnyOther) {
    openAndSearchFor(QStringLiteral("scanner 10"));

    key(Qt::Key_Down);
    click(row("com.example.scanner-10"));

    EXPECT_FALSE(row("com.example.scanner-10")->property("isOn").toBool());
    const auto found = session().row("com.example.scanner-10");
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)->value(), RowValue(false));
    EXPECT_EQ(applications().size(), 1U);
}

TEST_F(Search, TheSearchEndsWithTheRowsItIsFor) {
    openAndSearchFor(QStringLiteral("notes"));
    ASSERT_EQ(applications().size(), 1U);

    // Without its applications the page has no field, and with them it begins anew.
    click(row("Nimbra Drive"));
    EXPECT_EQ(field(), nullptr);
    EXPECT_EQ(pane().rows()->search(), QString());
    click(row("Nimbra Drive"));
    ASSERT_NE(field(), nullptr);
    EXPECT_EQ(field()->property("text").toString(), QString());
    EXPECT_GE(applications().size(), 12U);
}

TEST_F(Search, APageThatIsOpenedAgainShowsAll) {
    openAndSearchFor(QStringLiteral("notes"));
    click(control(QStringLiteral("Back, Account")));
    ASSERT_FALSE(pane().isOpen());

    click(row(labels().front()));

    EXPECT_GE(applications().size(), 12U);
    EXPECT_EQ(field()->property("text").toString(), QString());
}

TEST_F(Search, FewApplicationsNeedNoSearch) {
    makeUsedDevice();
    openPane();

    EXPECT_EQ(field(), nullptr);
    key(Qt::Key_F, Qt::ControlModifier);
    EXPECT_TRUE(row("Nimbra Drive")->hasActiveFocus());
}

TEST_F(Search, AFieldThatWasClearedStillSaysWhatIsSearchedFor) {
    openAndSearchFor(QStringLiteral("notes"));
    key(Qt::Key_Escape);
    type(QStringLiteral("at"));
    ASSERT_EQ(pane().rows()->search(), QStringLiteral("at"));

    pane().rows()->setSearch({});
    settle();

    EXPECT_EQ(field()->property("text").toString(), QString());
}

TEST_F(Search, WhatIsSearchedForStandsInTheMiddleAlsoWhereItIsShortened) {
    makeSampleDevice();
    Arguments large = arguments();
    large.size = {320, 640};
    large.appearance.textScale = 3;
    openPane(large);

    QQuickItem* const ground = named("search")->parentItem();
    const QQuickItem* told = nullptr;
    for (QQuickItem* const item : shownItems(ground)) {
        if (item->property("text").toString() == QStringLiteral("Search apps")) {
            told = item;
        }
    }

    ASSERT_NE(told, nullptr);
    EXPECT_TRUE(told->property("truncated").toBool());
    const QRectF painted = told->mapRectToItem(ground, told->boundingRect());
    EXPECT_LT(painted.height(), ground->height());
    EXPECT_NEAR(painted.center().y(), ground->height() / 2, 1);
}

TEST_F(Search, RowsMayGoBeforeThoseBelowTheWindowHaveBeenMade) {
    // Given a page that has just been drawn for the first time
    makeSampleDevice();
    start();
    pane().open();
    static_cast<void>(window().grabWindow());

    // When most of its rows go at once, and the page after them
    pane().rows()->setSearch(QStringLiteral("zebra"));
    static_cast<void>(window().grabWindow());
    pane().goBack();

    // Then nothing complains, which would fail the test
    settle();
    EXPECT_FALSE(pane().isOpen());
}

} // namespace nimbra::window
