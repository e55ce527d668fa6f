#include "host/qt/RowsModel.h"

#include <QSignalSpy>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::window {

namespace {

/// A list with one row of each kind that has a value, whose values change without a word.
class RowsModelValues : public testing::Test {
protected:
    RowsModelValues() { _rows.show({_switch, _link}); }

    [[nodiscard]] bool isShownOn() const {
        return _rows.index(switchPlace).data(RowsModel::IsOnRole).toBool();
    }
    [[nodiscard]] std::string shownText() const {
        return _rows.index(linkPlace).data(RowsModel::ValueRole).toString().toStdString();
    }

    static constexpr int switchPlace = 0;
    static constexpr int linkPlace = 1;

    bool _isOn = false;
    std::string _text = "before";
    std::shared_ptr<Specifier> _switch = Specifier::preferenceSpecifierNamed(
        "Switch", {.target = nullptr,
                   .set = [](const RowValue&, const auto&) {},
                   .get = [this](const Specifier&) { return RowValue(_isOn); },
                   .cell = SwitchCell});
    std::shared_ptr<Specifier> _link = Specifier::preferenceSpecifierNamed(
        "Link", {.target = nullptr,
                 .set = {},
                 .get = [this](const Specifier&) { return RowValue(Text(_text)); },
                 .cell = LinkListCell});
    /// What a switch does; a test may change it.
    std::function<bool(bool isOn)> _set = [](bool) { return true; };
    RowsModel _rows{{.set = [this](const auto&, bool isOn) { return _set(isOn); },
                     .tap = [](const auto&) { return true; }}};
};

} // namespace

TEST_F(RowsModelValues, ASwitchStaysAsItWasLeftWhileThePageSaysNothing) {
    ASSERT_FALSE(isShownOn());

    _rows.set(switchPlace, true);

    EXPECT_TRUE(isShownOn());
}

TEST_F(RowsModelValues, WhatThePageSaysDuringTheActionIsTheLastWord) {
    // Given an action in which the row is told to be read again, as after a save that has failed
    ASSERT_FALSE(isShownOn());
    _set = [this](bool) {
        _rows.didReloadRow(*_switch, false);
        EXPECT_FALSE(isShownOn());
        return true;
    };

    _rows.set(switchPlace, true);

    EXPECT_FALSE(isShownOn());
}

TEST_F(RowsModelValues, ARefusedSwitchIsDrawnAsThePageHasIt) {
    ASSERT_FALSE(isShownOn());
    QSignalSpy changes(&_rows, &QAbstractItemModel::dataChanged);
    _set = [](bool) { return false; };

    _rows.set(switchPlace, true);

    EXPECT_FALSE(isShownOn());
    ASSERT_EQ(changes.count(), 1);
    EXPECT_EQ(changes.front().front().toModelIndex().row(), switchPlace);
}

TEST_F(RowsModelValues, LinksAreAskedEachTimeTheyAreDrawn) {
    ASSERT_EQ(shownText(), "before");
    ASSERT_FALSE(isShownOn());

    _text = "after";
    _isOn = true;

    EXPECT_EQ(shownText(), "after");
    EXPECT_FALSE(isShownOn()) << "a switch stays as it is until the page says that it has changed";
}

TEST_F(RowsModelValues, OnlyLinksAreDrawnAnewWhereOnlyTheyMayHaveChanged) {
    QSignalSpy changes(&_rows, &QAbstractItemModel::dataChanged);

    _rows.drawLinksAnew();

    ASSERT_EQ(changes.count(), 1);
    EXPECT_EQ(changes.front().front().toModelIndex().row(), linkPlace);
}

} // namespace nimbra::window
