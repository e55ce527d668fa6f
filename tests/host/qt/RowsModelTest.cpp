#include "host/qt/RowsModel.h"

#include "tests/host/qt/WindowFixture.h"

#include <QSignalSpy>

namespace nimbra::window {

namespace {

class RowsModelTest : public testing::Test {
protected:
    static std::shared_ptr<Specifier> rowOf(const char* name, const char* identifier) {
        auto row = Specifier::preferenceSpecifierNamed(
            name, {.target = nullptr, .set = {}, .get = {}, .cell = SwitchCell});
        if (identifier != nullptr) {
            row->setIdentifier(identifier);
        }
        return row;
    }
    /// What is shown under the titles of the rows.
    [[nodiscard]] std::vector<std::string> distinctions() const {
        std::vector<std::string> shown;
        for (int row = 0; row < _rows.rowCount(); ++row) {
            shown.push_back(
                _rows.index(row).data(RowsModel::DistinctionRole).toString().toStdString());
        }
        return shown;
    }
    /// The rows that `changes` tells of as distinguished in another way.
    static std::vector<int> toldOf(const QSignalSpy& changes) {
        std::vector<int> rows;
        for (const auto& change : changes) {
            if (change.at(2).value<QList<int>>() == QList<int>{RowsModel::DistinctionRole}) {
                rows.push_back(change.front().toModelIndex().row());
            }
        }
        return rows;
    }

    using Texts = std::vector<std::string>;

    RowsModel _rows{
        {.set = [](const auto&, bool) { return true; }, .tap = [](const auto&) { return true; }}};
};

class SameTitles : public WindowTest {};

} // namespace

TEST_F(RowsModelTest, RowsOfOneTitleAreToldApartWhileThereAreSeveral) {
    // Given two rows of one name, and others
    const auto group = Specifier::groupSpecifierWithID("Reader");
    const auto first = rowOf("Reader", "org.example.reader");
    const auto other = rowOf("Notes", "org.example.notes");
    const auto second = rowOf("Reader", "com.example.reader");
    _rows.show({group, first, other});
    EXPECT_EQ(distinctions(), (Texts{"", "", ""}));

    // When the second one comes
    QSignalSpy changes(&_rows, &QAbstractItemModel::dataChanged);
    _rows.didInsert({second}, *other, true);

    // Then both bear what tells them apart, and the view hears it of both
    EXPECT_EQ(distinctions(), (Texts{"", "org.example.reader", "", "com.example.reader"}));
    EXPECT_EQ(toldOf(changes), (std::vector{1, 3}));

    // When the first one goes, the other one is alone with its name
    changes.clear();
    _rows.didRemove({first}, true);
    EXPECT_EQ(distinctions(), (Texts{"", "", ""}));
    EXPECT_EQ(toldOf(changes), std::vector{2});

    // When it comes again, at the end
    _rows.didAppend({first}, true);
    EXPECT_EQ(distinctions(), (Texts{"", "", "com.example.reader", "org.example.reader"}));
}

TEST_F(RowsModelTest, RowsOfAPageThatHasGoneAreAskedNothingWhileTheyGo) {
    // Given rows that nobody has looked at before their page goes
    int questions = 0;
    const auto counted = [&questions](const char* identifier) {
        auto row =
            Specifier::preferenceSpecifierNamed("Notes", {.target = nullptr,
                                                          .set = {},
                                                          .get =
                                                              [&questions](const Specifier&) {
                                                                  ++questions;
                                                                  return RowValue(true);
                                                              },
                                                          .cell = SwitchCell});
        row->setIdentifier(identifier);
        return row;
    };
    const SpecifierArray gone{counted("one"), counted("two"), counted("three")};
    const auto lookAtAll = [this] {
        for (int row = 0; row < _rows.rowCount(); ++row) {
            static_cast<void>(_rows.index(row).data(RowsModel::IsOnRole));
        }
    };
    QObject::connect(&_rows, &RowsModel::rowsAboutToBeRemoved, lookAtAll);
    _rows.show(gone);
    _rows.freeze();

    // When another list takes their place, of which one has the identifier of one that goes
    const auto stays = rowOf("Notes", "two");
    _rows.show({stays});
    EXPECT_EQ(questions, 0);

    // And when nothing does
    _rows.show(gone);
    _rows.freeze();
    _rows.show({});
    EXPECT_EQ(questions, 0);

    // Then those of a list that is shown again are asked as ever
    _rows.show(gone);
    lookAtAll();
    EXPECT_EQ(questions, 3);
}

TEST_F(RowsModelTest, AListThatIsBuiltAnewTellsItsOwnRowsApart) {
    _rows.show({rowOf("Reader", "one"), rowOf("Reader", "two")});
    ASSERT_EQ(distinctions(), (Texts{"one", "two"}));

    // When a row has another name than before, and a third one comes
    _rows.show({rowOf("Reader", "one"), rowOf("Atlas", "two"), rowOf("Atlas", "three")});
    EXPECT_EQ(distinctions(), (Texts{"", "two", "three"}));

    // When rows that are as they were are told again, nobody hears that they are told apart
    QSignalSpy changes(&_rows, &QAbstractItemModel::dataChanged);
    _rows.show({rowOf("Reader", "one"), rowOf("Atlas", "two"), rowOf("Atlas", "three")});
    EXPECT_EQ(distinctions(), (Texts{"", "two", "three"}));
    EXPECT_EQ(toldOf(changes), std::vector<int>());
}

TEST_F(RowsModelTest, OnlyRowsAreToldApartAndOnlyByAnIdentifier) {
    // A heading is no row, and a row without an identifier has nothing to be told by.
    auto heading = Specifier::preferenceSpecifierNamed(
        "Notes", {.target = nullptr, .set = {}, .get = {}, .cell = GroupCell});
    _rows.show(
        {heading, rowOf("Notes", "notes"), rowOf("Reader", nullptr), rowOf("Reader", "one")});

    EXPECT_EQ(distinctions(), (Texts{"", "", "", "one"}));
}

TEST_F(SameTitles, ASecondLineAndTheDescriptionTellWhichRowItIs) {
    makeSampleDevice();
    openPane();

    QQuickItem* const reader = row("org.example.reader");
    ASSERT_NE(reader, nullptr);
    EXPECT_EQ(nameOf(reader), "Reader");
    EXPECT_EQ(descriptionOf(reader), "org.example.reader");
    const qreal height = reader->height();
    EXPECT_EQ(descriptionOf(row("com.example.reader")), "com.example.reader");

    QQuickItem* const unique = row("com.example.notes");
    EXPECT_EQ(descriptionOf(unique), "");
    EXPECT_GT(height, unique->height());
}

} // namespace nimbra::window
