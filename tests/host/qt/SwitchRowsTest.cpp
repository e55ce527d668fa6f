#include "host/core/PaneSession.h"
#include "tests/host/qt/WindowFixture.h"

#include <QSignalSpy>
#include <algorithm>

namespace nimbra::window {

namespace {

constexpr const char* master = "Nimbra Drive";

class SwitchRows : public WindowTest {
protected:
    [[nodiscard]] bool isOn(const std::string& label) {
        QQuickItem* const found = row(label);
        EXPECT_NE(found, nullptr) << label;
        const bool isShownOn = found != nullptr && found->property("isOn").toBool();
        // What is seen is what a screen reader tells.
        EXPECT_EQ(static_cast<bool>(stateOf(found).checked), isShownOn);
        return isShownOn;
    }
    [[nodiscard]] bool isListed(const std::string& label) {
        return std::ranges::count(labels(), label) > 0;
    }
    /// What is stored, as another session would read it.
    [[nodiscard]] RowValue storedValueOf(const std::string& label) {
        const auto found = session().row(label);
        EXPECT_TRUE(found);
        return found ? (*found)->value() : RowValue();
    }
};

} // namespace

TEST_F(SwitchRows, RowsComeAndGoWithTheSwitchAndTheListIsNeverBuiltAnew) {
    makeSampleDevice();
    openPane();
    const auto before = labels();
    QSignalSpy resets(pane().rows(), &QAbstractItemModel::modelReset);
    QSignalSpy removals(pane().rows(), &QAbstractItemModel::rowsRemoved);
    QSignalSpy insertions(pane().rows(), &QAbstractItemModel::rowsInserted);
    ASSERT_TRUE(isOn(master));

    click(row(master));

    EXPECT_FALSE(isOn(master));
    EXPECT_EQ(storedValueOf(master), RowValue(false));
    EXPECT_EQ(labels().front(), master);
    EXPECT_EQ(row("com.example.notes"), nullptr);
    EXPECT_GT(removals.count(), 0);
    EXPECT_EQ(insertions.count(), 0);

    act(row(master), QAccessibleActionInterface::toggleAction());

    EXPECT_TRUE(isOn(master));
    EXPECT_EQ(storedValueOf(master), RowValue(true));
    EXPECT_EQ(labels(), before);
    EXPECT_GT(insertions.count(), 0);
    EXPECT_EQ(resets.count(), 0);
}

TEST_F(SwitchRows, TheListStaysWhereItIsWhenRowsGo) {
    // Given a window in which even what stays is higher than the window
    makeSampleDevice();
    Arguments small = arguments();
    small.size = {320, 320};
    small.appearance.textScale = 2;
    openPane(small);
    const auto position = [this] {
        return list()->property("contentY").toReal() - list()->property("originY").toReal();
    };
    list()->setProperty("contentY", list()->property("originY").toReal() + 40);
    settle();
    ASSERT_EQ(position(), 40);

    // When the rows of the applications go, and come back
    key(Qt::Key_Space);
    ASSERT_FALSE(isListed("com.example.notes"));
    EXPECT_EQ(position(), 40);
    key(Qt::Key_Space);
    ASSERT_TRUE(isListed("com.example.notes"));
    EXPECT_EQ(position(), 40);
}

TEST_F(SwitchRows, AnApplicationsSwitchIsStored) {
    makeUsedDevice();
    openPane();
    ASSERT_TRUE(isOn("notes"));
    ASSERT_FALSE(isOn("atlas"));

    click(row("notes"));
    act(row("atlas"), QAccessibleActionInterface::toggleAction());

    EXPECT_FALSE(isOn("notes"));
    EXPECT_TRUE(isOn("atlas"));
    EXPECT_EQ(storedValueOf("notes"), RowValue(false));
    EXPECT_EQ(storedValueOf("atlas"), RowValue(true));
    click(row("notes"));
    EXPECT_TRUE(isOn("notes"));
    EXPECT_EQ(storedValueOf("notes"), RowValue(true));
}

TEST_F(SwitchRows, SpaceAndReturnFlipTheSwitchWithTheFocus) {
    makeUsedDevice();
    openPane();
    click(row("notes"));
    ASSERT_FALSE(isOn("notes"));

    key(Qt::Key_Space);
    EXPECT_TRUE(isOn("notes"));
    key(Qt::Key_Return);
    EXPECT_FALSE(isOn("notes"));
    key(Qt::Key_Enter);
    EXPECT_TRUE(isOn("notes"));
}

TEST_F(SwitchRows, ASaveThatFailsPutsTheSwitchBack) {
    makeUsedDevice(R"(, "faults": {"save": [
        {"domain": "StoreErrorDomain", "code": 7, "description": "the store refuses"}]})");
    openPane();
    const auto before = labels();

    click(row(master));

    EXPECT_TRUE(isOn(master));
    EXPECT_EQ(storedValueOf(master), RowValue(true));
    EXPECT_EQ(labels(), before);
    // The next one is made.
    click(row(master));
    EXPECT_FALSE(isOn(master));
    EXPECT_NE(labels(), before);
}

TEST_F(SwitchRows, ASaveThatFailsPutsTheSwitchForCellularDataBack) {
    makeUsedDevice(R"(, "faults": {"save": [
        {"domain": "StoreErrorDomain", "code": 7, "description": "the store refuses"}]})");
    openPane();
    ASSERT_FALSE(isOn("Use Cellular Data"));

    click(row("Use Cellular Data"));

    EXPECT_FALSE(isOn("Use Cellular Data"));
    EXPECT_EQ(storedValueOf("Use Cellular Data"), RowValue(false));
    // The next one is made.
    click(row("Use Cellular Data"));
    EXPECT_TRUE(isOn("Use Cellular Data"));
}

TEST_F(SwitchRows, ARefusedChangeOfAnApplicationShowsWhenThePageLooksAgain) {
    makeUsedDevice(R"(, "faults": {"consentSet": [false]})");
    openPane();
    ASSERT_TRUE(isOn("notes"));

    click(row("notes"));
    pane().becomeActive();
    settle();

    EXPECT_TRUE(isOn("notes"));
    EXPECT_EQ(storedValueOf("notes"), RowValue(true));
}

TEST_F(SwitchRows, ALockedRowSaysSoAndDoesNothing) {
    makeUsedDevice(R"(, "restrictions": {"appCellularDataModificationAllowed": false,
                                         "cloudSyncDenied": ["notes"]})");
    openPane();
    for (const std::string label : {"Use Cellular Data", "notes"}) {
        QQuickItem* const locked = row(label);
        ASSERT_NE(locked, nullptr) << label;
        const bool before = isOn(label);

        EXPECT_EQ(descriptionOf(locked), "Locked");
        click(locked);
        EXPECT_EQ(isOn(label), before);
        key(Qt::Key_Space);
        EXPECT_EQ(isOn(label), before);
        act(locked, QAccessibleActionInterface::toggleAction());
        EXPECT_EQ(isOn(label), before);
        EXPECT_EQ(storedValueOf(label), RowValue(before));
        // It can be found with the keyboard all the same.
        EXPECT_TRUE(row(label)->hasActiveFocus());
    }
    EXPECT_EQ(descriptionOf(row(master)), "");
}

TEST_F(SwitchRows, TheSwitchForCellularDataIsStored) {
    makeUsedDevice();
    openPane();
    ASSERT_FALSE(isOn("Use Cellular Data"));

    click(row("Use Cellular Data"));

    EXPECT_TRUE(isOn("Use Cellular Data"));
    EXPECT_EQ(storedValueOf("Use Cellular Data"), RowValue(true));
}

} // namespace nimbra::window
